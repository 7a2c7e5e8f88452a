#include "FFT/Plugins/Plpv.h"

#include <algorithm>
#include <cmath>

#include "FFT/PhaseMath.h"

namespace ora::fft {

bool Plpv::Configure(Frame& frame, const Context& context) {
    m_bins = context.bins;
    m_candidates.assign(context.bins, 0);
    m_peaks.reserve(kPeakCapacity);
    m_peakPhase.assign(kPeakCapacity, 0.0f);
    for (variable v : {variable::SFEAT, variable::PHASE_IN, variable::TGRAD, variable::PHASE_START})
        if (!frame.RequireVector(v, type::FREQ_REAL_VECTOR, context.rows, context.bins)) return false;
    return true;
}

void Plpv::SetLog10Threshold(float log10Eps) { m_threshold = std::pow(10.0f, log10Eps); }

void Plpv::SetMaxPeaks(std::size_t count) { m_maxPeaks = std::min(std::max<std::size_t>(count, 1), kPeakCapacity); }

std::size_t Plpv::FindPeaks(const float* mag) noexcept {
    const std::size_t bins = m_bins;
    const float eps = m_threshold * *std::max_element(mag, mag + bins);
    m_eps = eps;
    std::size_t count = 0;
    for (std::size_t k = 0; k < bins; ++k) {
        const float v = mag[k];
        if (!(v > eps)) continue;
        // A local maximum over two bins each side (a Hann main lobe's width).
        bool peak = true;
        for (std::size_t d = 1; d <= 2 && peak; ++d) {
            if (k >= d && !(v > mag[k - d])) peak = false;
            if (k + d < bins && v < mag[k + d]) peak = false;
        }
        if (peak) m_candidates[count++] = static_cast<std::int32_t>(k);
    }
    const auto begin = m_candidates.begin();
    if (count > m_maxPeaks) {
        std::nth_element(begin, begin + static_cast<std::ptrdiff_t>(m_maxPeaks), begin + static_cast<std::ptrdiff_t>(count),
                         [mag](std::int32_t a, std::int32_t b) { return mag[a] > mag[b]; });
        count = m_maxPeaks;
    }
    std::sort(begin, begin + static_cast<std::ptrdiff_t>(count));
    m_peaks.clear();
    for (std::size_t i = 0; i < count; ++i) m_peaks.push_back(m_candidates[i]);  // within reserved capacity
    return count;
}

void Plpv::ProcessRow(const float* mag, const float* phase, const float* tgrad, float* psi, double hop) noexcept {
    const std::size_t bins = m_bins;
    const std::size_t count = FindPeaks(mag);
    if (count == 0) {
        std::copy(phase, phase + bins, psi);
        return;
    }
    // Every peak's new phase first: the update below overwrites the previous ones.
    for (std::size_t i = 0; i < count; ++i) {
        const auto p = static_cast<std::size_t>(m_peaks[i]);
        m_peakPhase[i] = static_cast<float>(Princarg(psi[p] + hop * tgrad[p]));
    }
    std::size_t start = 0;
    for (std::size_t i = 0; i < count; ++i) {
        const auto p = static_cast<std::size_t>(m_peaks[i]);
        std::size_t end = bins;
        if (i + 1 < count) {
            const auto q = static_cast<std::size_t>(m_peaks[i + 1]);
            end = p + 1;
            for (std::size_t k = p + 1; k < q; ++k)
                if (mag[k] < mag[end]) end = k;
            end = std::max(end, p + 1);
        }
        const double offset = static_cast<double>(m_peakPhase[i]) - phase[p];
        for (std::size_t k = start; k < end; ++k)
            psi[k] = mag[k] > m_eps ? static_cast<float>(Princarg(offset + phase[k])) : phase[k];
        start = end;
    }
}

void Plpv::Process(Frame& frame, Context& context) noexcept {
    if (!m_enabled) return;
    const float* mag = frame.Real(variable::SFEAT, type::FREQ_REAL_VECTOR);
    const float* phase = frame.Real(variable::PHASE_IN, type::FREQ_REAL_VECTOR);
    const float* tgrad = frame.Real(variable::TGRAD, type::FREQ_REAL_VECTOR);
    float* psi = frame.Real(variable::PHASE_START, type::FREQ_REAL_VECTOR);
    if (!mag || !phase || !tgrad || !psi) return;
    const std::size_t bins = context.bins;
    for (std::size_t r = context.FirstReconstructedRow(); r < context.EndReconstructedRow(); ++r) {
        const std::size_t o = r * bins;
        if (context.frameIndex == 0) {
            std::copy(phase + o, phase + o + bins, psi + o);
            continue;
        }
        ProcessRow(mag + o, phase + o, tgrad + o, psi + o, static_cast<double>(context.synthesisHop));
    }
}

}  // namespace ora::fft
