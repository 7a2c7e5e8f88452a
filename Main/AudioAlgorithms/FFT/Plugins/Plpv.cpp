#include "FFT/Plugins/Plpv.h"

#include <algorithm>
#include <cmath>

#include "FFT/PhaseMath.h"

namespace ora::fft {

bool Plpv::Configure(Frame& frame, const Context& context) {
    m_bins = context.bins;
    m_candidates.assign(context.bins + 4, 0);
    // Room for reading four past the end, kept below any magnitude.
    m_padded.Resize(context.bins + 8);
    std::fill(m_padded.begin(), m_padded.end(), -1.0f);
    m_peaks.reserve(kPeakCapacity);
    m_peakPhase.assign(kPeakCapacity, 0.0f);
    m_steps.assign(context.bins, 0.0);
    m_prevMag.Resize(context.bins * context.rows);
    for (variable v : {variable::SFEAT, variable::PHASE_IN, variable::TGRAD, variable::FGRAD_RIGHT,
                       variable::PHASE_START})
        if (!frame.RequireVector(v, type::FREQ_REAL_VECTOR, context.rows, context.bins)) return false;
    return true;
}

void Plpv::Reset() noexcept { m_prevMag.Clear(); }

void Plpv::SetLog10Threshold(float log10Eps) { m_threshold = std::pow(10.0f, log10Eps); }

void Plpv::SetMaxPeaks(std::size_t count) { m_maxPeaks = std::min(std::max<std::size_t>(count, 1), kPeakCapacity); }

std::size_t Plpv::FindPeaks(const float* mag) noexcept {
    const std::size_t bins = m_bins;
    const float eps = m_threshold * *std::max_element(mag, mag + bins);
    m_eps = eps;
    // A local maximum over two bins each side (a Hann main lobe's width):
    // above those below it, not below those above. Two bins of -1 each side
    // stand for the ends.
    float* padded = m_padded.data();
    std::copy(mag, mag + bins, padded + 2);
    std::size_t count = 0;
    for (std::size_t k = 0; k < bins; k += 4) {
        const Float4 v = Load4(padded + k + 2);
        const Int4 peak = (v > eps) & (v > Load4(padded + k + 1)) & (v > Load4(padded + k)) &
                          (v >= Load4(padded + k + 3)) & (v >= Load4(padded + k + 4));
        for (std::size_t i = 0; i < 4; ++i) {
            m_candidates[count] = static_cast<std::int32_t>(k + i);
            count += peak[i] != 0 && k + i < bins ? 1 : 0;
        }
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

void Plpv::ProcessRow(const float* mag, const float* phase, const float* tgrad, const float* right, float* psi,
                      float* prevMag, double hop) noexcept {
    const std::size_t bins = m_bins;
    const std::size_t count = FindPeaks(mag);
    // Phase of any bin relative to any other along the frame's steps.
    m_steps[0] = 0.0;
    for (std::size_t k = 1; k < bins; ++k) m_steps[k] = m_steps[k - 1] + right[k - 1];
    if (count == 0) {
        for (std::size_t k = 0; k < bins; ++k) psi[k] = static_cast<float>(Princarg(phase[0] + m_steps[k]));
        std::copy(mag, mag + bins, prevMag);
        return;
    }
    // Every peak's new phase first: the update below overwrites the previous ones.
    std::size_t strongest = 0;
    for (std::size_t i = 0; i < count; ++i) {
        const auto p = static_cast<std::size_t>(m_peaks[i]);
        m_peakPhase[i] = static_cast<float>(Princarg(psi[p] + hop * tgrad[p]));
        if (mag[p] > mag[m_peaks[strongest]]) strongest = i;
    }
    const double reference = m_peakPhase[strongest] - m_steps[static_cast<std::size_t>(m_peaks[strongest])];
    for (std::size_t i = 0; i < count; ++i) {
        const auto p = static_cast<std::size_t>(m_peaks[i]);
        if (i != strongest && mag[p] > kNewPeakRise * prevMag[p])
            m_peakPhase[i] = static_cast<float>(Princarg(reference + m_steps[p]));
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
        const double offset = m_peakPhase[i] - m_steps[p];
        for (std::size_t k = start; k < end; ++k)
            psi[k] = mag[k] > m_eps ? static_cast<float>(Princarg(offset + m_steps[k])) : phase[k];
        start = end;
    }
    std::copy(mag, mag + bins, prevMag);
}

void Plpv::Process(Frame& frame, Context& context) noexcept {
    if (!m_enabled) return;
    const float* mag = frame.Real(variable::SFEAT, type::FREQ_REAL_VECTOR);
    const float* phase = frame.Real(variable::PHASE_IN, type::FREQ_REAL_VECTOR);
    const float* tgrad = frame.Real(variable::TGRAD, type::FREQ_REAL_VECTOR);
    const float* right = frame.Real(variable::FGRAD_RIGHT, type::FREQ_REAL_VECTOR);
    float* psi = frame.Real(variable::PHASE_START, type::FREQ_REAL_VECTOR);
    if (!mag || !phase || !tgrad || !right || !psi) return;
    const std::size_t bins = context.bins;
    for (std::size_t r = context.FirstReconstructedRow(); r < context.EndReconstructedRow(); ++r) {
        const std::size_t o = r * bins;
        if (context.frameIndex == 0) {
            std::copy(phase + o, phase + o + bins, psi + o);
            std::copy(mag + o, mag + o + bins, m_prevMag.data() + o);
            continue;
        }
        ProcessRow(mag + o, phase + o, tgrad + o, right + o, psi + o, m_prevMag.data() + o,
                   static_cast<double>(context.synthesisHop));
    }
}

}  // namespace ora::fft
