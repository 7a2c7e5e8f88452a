#include "FFT/Plugins/PhaseGrad.h"

#include <algorithm>
#include <cmath>

#include "FFT/PhaseMath.h"

namespace ora::fft {

namespace {
// Log-magnitude floor relative to the frame's largest magnitude (-200 dB):
// keeps the gradients of near-empty bins finite.
constexpr float kLogFloor = 1e-10f;
constexpr float kAbsoluteFloor = 1e-30f;
// Bins this far below the frame's largest power have no trustworthy time.
constexpr double kTimeFloor = 1e-10;
}  // namespace

bool PhaseGrad::Configure(Frame& frame, const Context& context) {
    m_bins = context.bins;
    const std::size_t size = context.rows * context.bins;
    m_prevPhase.Resize(size);
    m_prevMag2.Resize(size);
    m_prevPgTgrad.Resize(size);
    m_shift.Resize(context.bins);
    m_weight.Resize(context.bins);
    m_pgNow.Resize(context.bins);
    m_advance.Resize(context.bins);
    m_hasPrev.assign(context.rows, 0);
    for (variable v : {variable::SFEAT, variable::MAG2, variable::PHASE_IN, variable::MAG_LOG, variable::TGRAD,
                       variable::FGRAD_LEFT, variable::FGRAD_RIGHT})
        if (!frame.RequireVector(v, type::FREQ_REAL_VECTOR, context.rows, context.bins)) return false;
    return frame.Find(variable::MASK) != nullptr || frame.CreateScalar(variable::MASK, type::INT_SCALAR);
}

void PhaseGrad::Reset() noexcept {
    std::fill(m_hasPrev.begin(), m_hasPrev.end(), 0);
    m_prevPhase.Clear();
    m_prevMag2.Clear();
    m_prevPgTgrad.Clear();
}

bool PhaseGrad::UsePg(std::size_t row, const float* mag2, const Context& context) const noexcept {
    if (m_mode == Mode::PG || !m_hasPrev[row]) return true;
    if (m_mode == Mode::PV || context.analysisHop == static_cast<double>(context.synthesisHop)) return false;
    const float* prev = m_prevMag2.data() + row * m_bins;
    Float4 total = Splat(0.0f);
    Float4 rise = Splat(0.0f);
    std::size_t k = 0;
    for (; k + 4 <= m_bins; k += 4) {
        const Float4 now = Load4(mag2 + k);
        const Float4 change = now - Load4(prev + k);
        total += now;
        rise += Select4(change > 0.0f, change, Splat(0.0f));
    }
    float totalSum = total[0] + total[1] + total[2] + total[3];
    float riseSum = rise[0] + rise[1] + rise[2] + rise[3];
    for (; k < m_bins; ++k) {
        totalSum += mag2[k];
        riseSum += std::max(0.0f, mag2[k] - prev[k]);
    }
    return totalSum > 0.0f && riseSum > static_cast<float>(kOnsetShare) * totalSum;
}

void PhaseGrad::StretchShift(const Frame& frame, const Context& context, std::size_t row, float* shift,
                             float* weight) noexcept {
    const std::size_t bins = context.bins;
    const Frame::Variable* weightedVar = frame.Get(variable::CFEAT, type::FREQ_CPLX_VECTOR);
    const Frame::Variable* fsigVar = frame.Get(variable::FSIG, type::FREQ_CPLX_VECTOR);
    if (!context.Stretched() || weightedVar == nullptr || fsigVar == nullptr) {
        std::fill(shift, shift + bins, 0.0f);
        std::fill(weight, weight + bins, 1.0f);
        return;
    }
    const auto* weighted = reinterpret_cast<const Complex*>(weightedVar->data) + row * bins;
    const auto* fsig = reinterpret_cast<const Complex*>(fsigVar->data);
    const bool shared = row >= context.channels;
    // Re(weighted * conj(x)) / |x|^2: the bin's time from the centre.
    float peak = 0.0f;
    for (std::size_t k = 0; k < bins; ++k) {
        Complex x = shared ? Complex{} : fsig[row * bins + k];
        if (shared)
            for (std::size_t c = 0; c < context.channels; ++c) x += fsig[c * bins + k];
        const float power = x.real() * x.real() + x.imag() * x.imag();
        peak = std::max(peak, power);
        shift[k] = weighted[k].real() * x.real() + weighted[k].imag() * x.imag();
        weight[k] = power;
    }
    const Float4 floor = Splat(peak * static_cast<float>(kTimeFloor));
    const Float4 limit = Splat(static_cast<float>(context.frameLength / 2));
    double slope = 1.0, offset = 0.0;
    const bool line = context.SynthesisLine(slope, offset);
    // The time moved to where the map puts it, less the time: the shift.
    auto four = [&](Float4 cross, Float4 power, Float4& moved, Float4& trust) {
        const Int4 trusted = power > floor;
        Float4 time = cross / Select4(trusted, power, Splat(1.0f));
        time = Select4(trusted, Select4(time > limit, limit, Select4(time < -limit, -limit, time)), Splat(0.0f));
        moved = static_cast<float>(offset) + static_cast<float>(slope - 1.0) * time;
        if (!line)
            for (std::size_t i = 0; i < 4; ++i) moved[i] = static_cast<float>(context.SynthesisTime(time[i]) - time[i]);
        trust = Select4(trusted, power, Splat(0.0f));
    };
    std::size_t k = 0;
    for (; k + 4 <= bins; k += 4) {
        Float4 moved, trust;
        four(Load4(shift + k), Load4(weight + k), moved, trust);
        Store4(shift + k, moved);
        for (std::size_t i = 0; i < 4; ++i) weight[k + i] = std::sqrt(trust[i]);
    }
    for (; k < bins; ++k) {
        Float4 moved, trust;
        four(Splat(shift[k]), Splat(weight[k]), moved, trust);
        shift[k] = moved[0];
        weight[k] = std::sqrt(trust[0]);
    }
}

void PhaseGrad::Process(Frame& frame, Context& context) noexcept {
    const float* magAll = frame.Real(variable::SFEAT, type::FREQ_REAL_VECTOR);
    const float* mag2All = frame.Real(variable::MAG2, type::FREQ_REAL_VECTOR);
    const float* phaseAll = frame.Real(variable::PHASE_IN, type::FREQ_REAL_VECTOR);
    float* logAll = frame.Real(variable::MAG_LOG, type::FREQ_REAL_VECTOR);
    float* tgradAll = frame.Real(variable::TGRAD, type::FREQ_REAL_VECTOR);
    float* leftAll = frame.Real(variable::FGRAD_LEFT, type::FREQ_REAL_VECTOR);
    float* rightAll = frame.Real(variable::FGRAD_RIGHT, type::FREQ_REAL_VECTOR);
    std::int64_t* mask = frame.Int(variable::MASK);
    if (!magAll || !mag2All || !phaseAll || !logAll || !tgradAll || !leftAll || !rightAll || !mask) return;

    const std::size_t bins = context.bins;
    const double m = static_cast<double>(context.fftLength);
    const double n = static_cast<double>(context.frameLength);
    const double sigma2 = kHannLambda * n * n / kTwoPi;
    const double ha = context.analysisHop;
    const double binToOmega = kTwoPi / m;
    const auto omega = static_cast<float>(binToOmega);
    const Float4 lane = {0.0f, 1.0f, 2.0f, 3.0f};
    *mask = 0;

    // What a steady partial at each bin's frequency advances over the hop,
    // wrapped (the products themselves are too large for single precision).
    const double advanceStep = Princarg(binToOmega * ha);
    for (std::size_t k = 0; k < bins; ++k) m_advance[k] = static_cast<float>(Princarg(advanceStep * static_cast<double>(k)));

    for (std::size_t r = context.FirstReconstructedRow(); r < context.EndReconstructedRow(); ++r) {
        const std::size_t row = r * bins;
        const float* mag = magAll + row;
        const float* phase = phaseAll + row;
        float* logMag = logAll + row;
        float* tgrad = tgradAll + row;
        float* left = leftAll + row;
        float* right = rightAll + row;
        float* prevPhase = m_prevPhase.data() + row;
        float* prevPgTgrad = m_prevPgTgrad.data() + row;

        const float peak = *std::max_element(mag, mag + bins);
        const Float4 floor = Splat(std::max(kAbsoluteFloor, peak * kLogFloor));
        std::size_t k = 0;
        for (; k + 4 <= bins; k += 4) {
            const Float4 v = Load4(mag + k);
            Store4(logMag + k, Log4(Select4(v > floor, v, floor)));
        }
        for (; k < bins; ++k) logMag[k] = Log4(Splat(std::max(mag[k], floor[0])))[0];

        const bool pg = UsePg(r, mag2All + row, context);
        if (pg) *mask |= r < 64 ? std::int64_t{1} << r : 0;
        const bool hasPrev = m_hasPrev[r] != 0;

        // Magnitude-based estimate (the log-magnitude's slope across bins):
        // kept for the next frame even when this frame uses PV.
        const auto logToOmega = static_cast<float>(m / (kTwoPi * sigma2));
        float* pgNow = m_pgNow.data();
        pgNow[0] = logToOmega * (logMag[1] - logMag[0]);
        pgNow[bins - 1] = static_cast<float>(binToOmega * static_cast<double>(bins - 1)) +
                          logToOmega * (logMag[bins - 1] - logMag[bins - 2]);
        for (k = 1; k + 4 < bins; k += 4)
            Store4(pgNow + k, (lane + static_cast<float>(k)) * omega +
                                  (0.5f * logToOmega) * (Load4(logMag + k + 1) - Load4(logMag + k - 1)));
        for (; k + 1 < bins; ++k)
            pgNow[k] = static_cast<float>(k) * omega + 0.5f * logToOmega * (logMag[k + 1] - logMag[k - 1]);

        const double inverseHop = 1.0 / ha;
        // The PV estimate: the bin's frequency plus the phase it gained
        // beyond a steady partial's, per sample; the frequency is added in
        // double, as each frame adds the hop times this to a phase and a
        // rounding of it would drift.
        if (pg) {
            for (k = 0; k + 4 <= bins; k += 4) {
                const Float4 now = Load4(pgNow + k);
                Store4(tgrad + k, hasPrev ? 0.5f * (now + Load4(prevPgTgrad + k)) : now);
            }
            for (; k < bins; ++k) tgrad[k] = hasPrev ? 0.5f * (pgNow[k] + prevPgTgrad[k]) : pgNow[k];
        } else {
            for (k = 0; k < bins; k += 4) {
                const std::size_t count = std::min<std::size_t>(4, bins - k);
                Float4 deviation;
                if (count == 4) {
                    deviation = Princarg4(Load4(phase + k) - Load4(prevPhase + k) - Load4(m_advance.data() + k));
                } else {
                    for (std::size_t i = 0; i < 4; ++i) {
                        const std::size_t b = k + std::min(i, count - 1);
                        deviation[i] = Princarg1(phase[b] - prevPhase[b] - m_advance[b]);
                    }
                }
                for (std::size_t i = 0; i < count; ++i)
                    tgrad[k + i] = static_cast<float>(binToOmega * static_cast<double>(k + i) + deviation[i] * inverseHop);
            }
        }
        std::copy(pgNow, pgNow + bins, prevPgTgrad);

        // A bin whose energy sits a time t from the centre steps its phase
        // by -t per radian of frequency; between two bins the time of the
        // stronger counts for more (a weak bin's time is mostly its noise).
        float* shift = m_shift.data();
        float* weight = m_weight.data();
        StretchShift(frame, context, r, shift, weight);
        for (k = 0; k + 4 < bins; k += 4) {
            const Float4 w0 = Load4(weight + k), w1 = Load4(weight + k + 1);
            const Float4 total = w0 + w1;
            const Float4 shifted = w0 * Load4(shift + k) + w1 * Load4(shift + k + 1);
            const Int4 any = total > 0.0f;
            const Float4 time = Select4(any, shifted / Select4(any, total, Splat(1.0f)), Splat(0.0f));
            Store4(right + k, Princarg4(Load4(phase + k + 1) - Load4(phase + k)) - omega * time);
        }
        for (; k + 1 < bins; ++k) {
            const float total = weight[k] + weight[k + 1];
            const float time = total > 0.0f ? (weight[k] * shift[k] + weight[k + 1] * shift[k + 1]) / total : 0.0f;
            right[k] = Princarg1(phase[k + 1] - phase[k]) - omega * time;
        }
        right[bins - 1] = 0.0f;
        left[0] = 0.0f;
        std::copy(right, right + bins - 1, left + 1);

        std::copy(phase, phase + bins, prevPhase);
        std::copy(mag2All + row, mag2All + row + bins, m_prevMag2.data() + row);
        m_hasPrev[r] = 1;
    }
}

}  // namespace ora::fft
