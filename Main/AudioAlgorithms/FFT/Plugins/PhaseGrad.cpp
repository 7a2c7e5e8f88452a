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
}  // namespace

bool PhaseGrad::Configure(Frame& frame, const Context& context) {
    m_bins = context.bins;
    const std::size_t size = context.rows * context.bins;
    m_prevLog.Resize(size);
    m_prevPhase.Resize(size);
    m_prevMag2.Resize(size);
    m_prevPgTgrad.Resize(size);
    m_fgrad.Resize(context.bins);
    m_hasPrev.assign(context.rows, 0);
    for (variable v : {variable::SFEAT, variable::MAG2, variable::PHASE_IN, variable::MAG_LOG, variable::TGRAD,
                       variable::FGRAD, variable::FGRAD_LEFT, variable::FGRAD_RIGHT})
        if (!frame.RequireVector(v, type::FREQ_REAL_VECTOR, context.rows, context.bins)) return false;
    return frame.Find(variable::MASK) != nullptr || frame.CreateScalar(variable::MASK, type::INT_SCALAR);
}

void PhaseGrad::Reset() noexcept {
    std::fill(m_hasPrev.begin(), m_hasPrev.end(), 0);
    m_prevLog.Clear();
    m_prevPhase.Clear();
    m_prevMag2.Clear();
    m_prevPgTgrad.Clear();
}

bool PhaseGrad::UsePg(std::size_t row, const float* mag2, std::size_t analysisHop,
                      std::size_t synthesisHop) const noexcept {
    if (m_mode == Mode::PG || !m_hasPrev[row]) return true;
    if (m_mode == Mode::PV || analysisHop == synthesisHop) return false;
    const float* prev = m_prevMag2.data() + row * m_bins;
    double total = 0.0;
    double rise = 0.0;
    for (std::size_t k = 0; k < m_bins; ++k) {
        total += mag2[k];
        rise += std::max(0.0f, mag2[k] - prev[k]);
    }
    return total > 0.0 && rise > kOnsetShare * total;
}

void PhaseGrad::Process(Frame& frame, Context& context) noexcept {
    const float* magAll = frame.Real(variable::SFEAT, type::FREQ_REAL_VECTOR);
    const float* mag2All = frame.Real(variable::MAG2, type::FREQ_REAL_VECTOR);
    const float* phaseAll = frame.Real(variable::PHASE_IN, type::FREQ_REAL_VECTOR);
    float* logAll = frame.Real(variable::MAG_LOG, type::FREQ_REAL_VECTOR);
    float* tgradAll = frame.Real(variable::TGRAD, type::FREQ_REAL_VECTOR);
    float* fgradAll = frame.Real(variable::FGRAD, type::FREQ_REAL_VECTOR);
    float* leftAll = frame.Real(variable::FGRAD_LEFT, type::FREQ_REAL_VECTOR);
    float* rightAll = frame.Real(variable::FGRAD_RIGHT, type::FREQ_REAL_VECTOR);
    std::int64_t* mask = frame.Int(variable::MASK);
    if (!magAll || !mag2All || !phaseAll || !logAll || !tgradAll || !fgradAll || !leftAll || !rightAll || !mask) return;

    const std::size_t bins = context.bins;
    const double m = static_cast<double>(context.fftLength);
    const double n = static_cast<double>(context.frameLength);
    const double sigma2 = kHannLambda * n * n / kTwoPi;
    const double ha = static_cast<double>(context.analysisHop);
    const double binToOmega = kTwoPi / m;
    *mask = 0;

    for (std::size_t r = context.FirstReconstructedRow(); r < context.EndReconstructedRow(); ++r) {
        const std::size_t row = r * bins;
        const float* mag = magAll + row;
        const float* phase = phaseAll + row;
        float* logMag = logAll + row;
        float* tgrad = tgradAll + row;
        float* fgrad = fgradAll + row;
        float* left = leftAll + row;
        float* right = rightAll + row;
        float* prevLog = m_prevLog.data() + row;
        float* prevPhase = m_prevPhase.data() + row;
        float* prevPgTgrad = m_prevPgTgrad.data() + row;

        const float peak = *std::max_element(mag, mag + bins);
        const float floor = std::max(kAbsoluteFloor, peak * kLogFloor);
        for (std::size_t k = 0; k < bins; ++k) logMag[k] = std::log(std::max(mag[k], floor));

        const bool pg = UsePg(r, mag2All + row, context.analysisHop, context.synthesisHop);
        const bool pgSteps = m_mode == Mode::PG;
        if (pg) *mask |= std::int64_t{1} << r;
        const bool hasPrev = m_hasPrev[r] != 0;

        // Magnitude-based estimates: the PG time derivative is kept for the
        // next frame even when this frame uses PV.
        const double logToOmega = m / (kTwoPi * sigma2);
        for (std::size_t k = 0; k < bins; ++k) {
            const std::size_t lo = k > 0 ? k - 1 : k;
            const std::size_t hi = k + 1 < bins ? k + 1 : k;
            const double slope = (logMag[hi] - logMag[lo]) / static_cast<double>(hi - lo);
            const double pgNow = binToOmega * static_cast<double>(k) + logToOmega * slope;
            if (pg) tgrad[k] = static_cast<float>(hasPrev ? 0.5 * (pgNow + prevPgTgrad[k]) : pgNow);
            prevPgTgrad[k] = static_cast<float>(pgNow);
        }

        if (pgSteps) {
            const double logToStep = -binToOmega * sigma2 / ha;
            for (std::size_t k = 0; k < bins; ++k)
                m_fgrad[k] = hasPrev ? static_cast<float>(logToStep * (logMag[k] - prevLog[k])) : 0.0f;
            for (std::size_t k = 0; k < bins; ++k) {
                left[k] = k > 0 ? 0.5f * (m_fgrad[k - 1] + m_fgrad[k]) : m_fgrad[k];
                right[k] = k + 1 < bins ? 0.5f * (m_fgrad[k] + m_fgrad[k + 1]) : m_fgrad[k];
                fgrad[k] = m_fgrad[k];
            }
        } else {
            for (std::size_t k = 0; k < bins; ++k) {
                if (!pg) {
                    const double omega = binToOmega * static_cast<double>(k);
                    const double deviation = Princarg(static_cast<double>(phase[k]) - prevPhase[k] - omega * ha);
                    tgrad[k] = static_cast<float>(omega + deviation / ha);
                }
                left[k] = k > 0 ? static_cast<float>(Princarg(static_cast<double>(phase[k]) - phase[k - 1])) : 0.0f;
                right[k] = k + 1 < bins ? static_cast<float>(Princarg(static_cast<double>(phase[k + 1]) - phase[k])) : 0.0f;
                fgrad[k] = 0.5f * (left[k] + right[k]);
            }
        }

        std::copy(logMag, logMag + bins, prevLog);
        std::copy(phase, phase + bins, prevPhase);
        std::copy(mag2All + row, mag2All + row + bins, m_prevMag2.data() + row);
        m_hasPrev[r] = 1;
    }
}

}  // namespace ora::fft
