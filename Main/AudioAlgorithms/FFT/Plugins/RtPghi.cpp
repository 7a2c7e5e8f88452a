#include "FFT/Plugins/RtPghi.h"

#include <algorithm>
#include <cmath>

#include "FFT/PhaseMath.h"

namespace ora::fft {

namespace {
// Queue values: the bin, and whether the entry stands for the previous frame.
std::int32_t Current(std::size_t bin) { return static_cast<std::int32_t>(2 * bin); }
std::int32_t Previous(std::size_t bin) { return static_cast<std::int32_t>(2 * bin + 1); }
}  // namespace

bool RtPghi::Configure(Frame& frame, const Context& context) {
    m_bins = context.bins;
    m_queue.Configure(2 * context.bins);
    m_fresh.Configure(context.bins);
    m_done.assign(context.bins, 0);
    m_prevMag.Resize(context.rows * context.bins);
    m_prevLargest.assign(context.rows, 0.0f);
    for (variable v : {variable::SFEAT, variable::PHASE_IN, variable::TGRAD, variable::FGRAD_LEFT,
                       variable::FGRAD_RIGHT, variable::PHASE_START})
        if (!frame.RequireVector(v, type::FREQ_REAL_VECTOR, context.rows, context.bins)) return false;
    return true;
}

void RtPghi::Reset() noexcept {
    m_prevMag.Clear();
    std::fill(m_prevLargest.begin(), m_prevLargest.end(), 0.0f);
}

void RtPghi::SetLog10Tolerance(float log10Tol) { m_tolerance = std::pow(10.0f, log10Tol); }

void RtPghi::ProcessRow(std::size_t row, const float* mag, const float* phase, const float* tgrad, const float* left,
                        const float* right, float* psi, double hop) noexcept {
    const std::size_t bins = m_bins;
    float* prevMag = m_prevMag.data() + row * bins;
    const float largest = *std::max_element(mag, mag + bins);
    const float tol = m_tolerance * largest;

    m_queue.Start(std::max(largest, m_prevLargest[row]));
    std::size_t remaining = 0;
    for (std::size_t k = 0; k < bins; ++k) {
        const bool significant = mag[k] > tol;
        m_done[k] = significant ? 0 : 1;
        remaining += significant ? 1 : 0;
        if (significant && prevMag[k] > tol) m_queue.Push(prevMag[k], Previous(k));
    }
    bool freshReady = false;

    while (remaining > 0) {
        if (m_queue.Empty()) {
            // Nothing leads into what is left: start from its strongest.
            if (!freshReady) {
                m_fresh.Start(largest);
                for (std::size_t k = 0; k < bins; ++k)
                    if (!m_done[k]) m_fresh.Push(mag[k], static_cast<std::int32_t>(k));
                freshReady = true;
            }
            auto k = static_cast<std::size_t>(m_fresh.Pop());
            while (m_done[k]) k = static_cast<std::size_t>(m_fresh.Pop());
            psi[k] = phase[k];
            m_done[k] = 1;
            --remaining;
            m_queue.Push(mag[k], Current(k));
            continue;
        }
        const std::int32_t entry = m_queue.Pop();
        const auto k = static_cast<std::size_t>(entry / 2);
        if (entry % 2 != 0) {
            if (m_done[k]) continue;
            psi[k] = static_cast<float>(Princarg(psi[k] + hop * tgrad[k]));
            m_done[k] = 1;
            --remaining;
            m_queue.Push(mag[k], Current(k));
            continue;
        }
        if (k + 1 < bins && !m_done[k + 1]) {
            psi[k + 1] = static_cast<float>(Princarg(static_cast<double>(psi[k]) + right[k]));
            m_done[k + 1] = 1;
            --remaining;
            m_queue.Push(mag[k + 1], Current(k + 1));
        }
        if (k > 0 && !m_done[k - 1]) {
            psi[k - 1] = static_cast<float>(Princarg(static_cast<double>(psi[k]) - left[k]));
            m_done[k - 1] = 1;
            --remaining;
            m_queue.Push(mag[k - 1], Current(k - 1));
        }
    }
    for (std::size_t k = 0; k < bins; ++k)
        if (!(mag[k] > tol)) psi[k] = phase[k];
    std::copy(mag, mag + bins, prevMag);
    m_prevLargest[row] = largest;
}

void RtPghi::Process(Frame& frame, Context& context) noexcept {
    if (!m_enabled) return;
    const float* mag = frame.Real(variable::SFEAT, type::FREQ_REAL_VECTOR);
    const float* phase = frame.Real(variable::PHASE_IN, type::FREQ_REAL_VECTOR);
    const float* tgrad = frame.Real(variable::TGRAD, type::FREQ_REAL_VECTOR);
    const float* left = frame.Real(variable::FGRAD_LEFT, type::FREQ_REAL_VECTOR);
    const float* right = frame.Real(variable::FGRAD_RIGHT, type::FREQ_REAL_VECTOR);
    float* psi = frame.Real(variable::PHASE_START, type::FREQ_REAL_VECTOR);
    if (!mag || !phase || !tgrad || !left || !right || !psi) return;
    const std::size_t bins = context.bins;
    for (std::size_t r = context.FirstReconstructedRow(); r < context.EndReconstructedRow(); ++r) {
        const std::size_t o = r * bins;
        if (context.frameIndex == 0) {
            std::copy(phase + o, phase + o + bins, psi + o);
            std::copy(mag + o, mag + o + bins, m_prevMag.data() + o);
            m_prevLargest[r] = *std::max_element(mag + o, mag + o + bins);
            continue;
        }
        ProcessRow(r, mag + o, phase + o, tgrad + o, left + o, right + o, psi + o,
                   static_cast<double>(context.synthesisHop));
    }
}

}  // namespace ora::fft
