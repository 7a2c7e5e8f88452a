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
    double total = 0.0;
    double rise = 0.0;
    for (std::size_t k = 0; k < m_bins; ++k) {
        total += mag2[k];
        rise += std::max(0.0f, mag2[k] - prev[k]);
    }
    return total > 0.0 && rise > kOnsetShare * total;
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
    const double limit = static_cast<double>(context.frameLength / 2);
    double peak = 0.0;
    for (std::size_t k = 0; k < bins; ++k) {
        Complex x = shared ? Complex{} : fsig[row * bins + k];
        if (shared)
            for (std::size_t c = 0; c < context.channels; ++c) x += fsig[c * bins + k];
        const double power = static_cast<double>(x.real()) * x.real() + static_cast<double>(x.imag()) * x.imag();
        peak = std::max(peak, power);
        // Re(weighted * conj(x)) / |x|^2: the bin's time from the centre.
        const double cross = static_cast<double>(weighted[k].real()) * x.real() +
                             static_cast<double>(weighted[k].imag()) * x.imag();
        shift[k] = power > 0.0 ? static_cast<float>(cross / power) : 0.0f;
        weight[k] = static_cast<float>(std::sqrt(power));
    }
    const auto floor = static_cast<float>(std::sqrt(peak * kTimeFloor));
    double slope, offset;
    const bool line = context.SynthesisLine(slope, offset);
    for (std::size_t k = 0; k < bins; ++k) {
        const bool trusted = weight[k] > floor;
        const double time = trusted ? std::clamp(static_cast<double>(shift[k]), -limit, limit) : 0.0;
        const double moved = line ? offset + slope * time : context.SynthesisTime(time);
        shift[k] = static_cast<float>(moved - time);
        if (!trusted) weight[k] = 0.0f;
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
    *mask = 0;

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
        const float floor = std::max(kAbsoluteFloor, peak * kLogFloor);
        for (std::size_t k = 0; k < bins; ++k) logMag[k] = std::log(std::max(mag[k], floor));

        const bool pg = UsePg(r, mag2All + row, context);
        if (pg) *mask |= std::int64_t{1} << r;
        const bool hasPrev = m_hasPrev[r] != 0;

        // Magnitude-based estimate: kept for the next frame even when this
        // frame uses PV.
        const double logToOmega = m / (kTwoPi * sigma2);
        for (std::size_t k = 0; k < bins; ++k) {
            const std::size_t lo = k > 0 ? k - 1 : k;
            const std::size_t hi = k + 1 < bins ? k + 1 : k;
            const double slope = (logMag[hi] - logMag[lo]) / static_cast<double>(hi - lo);
            const double pgNow = binToOmega * static_cast<double>(k) + logToOmega * slope;
            if (pg) {
                tgrad[k] = static_cast<float>(hasPrev ? 0.5 * (pgNow + prevPgTgrad[k]) : pgNow);
            } else {
                const double omega = binToOmega * static_cast<double>(k);
                const double deviation = Princarg(static_cast<double>(phase[k]) - prevPhase[k] - omega * ha);
                tgrad[k] = static_cast<float>(omega + deviation / ha);
            }
            prevPgTgrad[k] = static_cast<float>(pgNow);
        }

        // A bin whose energy sits a time t from the centre steps its phase
        // by -t per radian of frequency; between two bins the time of the
        // stronger counts for more (a weak bin's time is mostly its noise).
        float* shift = m_shift.data();
        float* weight = m_weight.data();
        StretchShift(frame, context, r, shift, weight);
        const auto omega = static_cast<float>(binToOmega);
        left[0] = 0.0f;
        for (std::size_t k = 0; k + 1 < bins; ++k) {
            const auto step = static_cast<float>(Princarg(static_cast<double>(phase[k + 1]) - phase[k]));
            const float total = weight[k] + weight[k + 1];
            const float time = total > 0.0f ? (weight[k] * shift[k] + weight[k + 1] * shift[k + 1]) / total : 0.0f;
            right[k] = step - omega * time;
            left[k + 1] = right[k];
        }
        right[bins - 1] = 0.0f;

        std::copy(phase, phase + bins, prevPhase);
        std::copy(mag2All + row, mag2All + row + bins, m_prevMag2.data() + row);
        m_hasPrev[r] = 1;
    }
}

}  // namespace ora::fft
