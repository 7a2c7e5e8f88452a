#include "FFT/Plugins/In2Dft.h"

#include <algorithm>

#include "FFT/PhaseMath.h"

namespace ora::fft {

namespace {

void Multiply(const float* a, const float* b, float* out, std::size_t n) noexcept {
    std::size_t j = 0;
    for (; j + 4 <= n; j += 4) Store4(out + j, Load4(a + j) * Load4(b + j));
    for (; j < n; ++j) out[j] = a[j] * b[j];
}

}  // namespace

bool In2Dft::Configure(Frame& frame, const Context& context) {
    const std::size_t n = context.frameLength;
    m_frame.Resize(context.channels * n);
    if (!frame.RequireVector(variable::TSIG, type::SIG_REAL_VECTOR, context.channels, context.fftLength) ||
        !frame.RequireVector(variable::FSIG, type::FREQ_CPLX_VECTOR, context.channels, context.bins))
        return false;
    if (!m_timeWeighted) return true;
    m_sum.Resize(n);
    m_timeWindow.Resize(n);
    m_weighted.Resize(n);
    const float* win = context.window->Analysis();
    const double half = static_cast<double>(n / 2);
    for (std::size_t j = 0; j < n; ++j) m_timeWindow[j] = static_cast<float>((static_cast<double>(j) - half) * win[j]);
    return frame.RequireVector(variable::CFEAT, type::FREQ_CPLX_VECTOR, context.rows, context.bins);
}

void In2Dft::Centre(const float* samples, const float* window, float* t, std::size_t n, std::size_t m) noexcept {
    // Frame sample j sits at transform index (j - n/2) mod m.
    const std::size_t half = n / 2;
    std::fill(t + (n - half), t + (m - half), 0.0f);
    Multiply(samples, window, t + (m - half), half);
    Multiply(samples + half, window + half, t, n - half);
}

void In2Dft::Process(Frame& frame, Context& context) noexcept {
    float* tsig = frame.Real(variable::TSIG, type::SIG_REAL_VECTOR);
    Complex* fsig = frame.Cplx(variable::FSIG, type::FREQ_CPLX_VECTOR);
    if (tsig == nullptr || fsig == nullptr) return;
    const std::size_t n = context.frameLength;
    const std::size_t m = context.fftLength;
    const float* win = context.window->Analysis();
    for (std::size_t c = 0; c < context.channels; ++c) {
        float* samples = m_frame.data() + c * n;
        (*context.in)[c].Read(context.analysisStart, samples, n);
        float* t = tsig + c * m;
        Centre(samples, win, t, n, m);
        context.fft->ForwardReal(t, fsig + c * context.bins);
    }
    if (!m_timeWeighted || !context.Stretched()) return;
    Complex* weighted = frame.Cplx(variable::CFEAT, type::FREQ_CPLX_VECTOR);
    if (weighted == nullptr) return;
    // Time from the frame's true centre, which lies analysisOffset past the
    // middle of the samples read.
    const auto offset = static_cast<float>(context.analysisOffset);
    std::size_t j = 0;
    for (; j + 4 <= n; j += 4) Store4(m_weighted.data() + j, Load4(m_timeWindow.data() + j) - offset * Load4(win + j));
    for (; j < n; ++j) m_weighted[j] = m_timeWindow[j] - offset * win[j];
    // TSIG's first row is free again once its transform is done.
    float* t = tsig;
    if (context.SharedRow()) {
        const float* first = m_frame.data();
        std::copy(first, first + n, m_sum.data());
        for (std::size_t c = 1; c < context.channels; ++c) {
            const float* s = m_frame.data() + c * n;
            std::size_t i = 0;
            for (; i + 4 <= n; i += 4) Store4(m_sum.data() + i, Load4(m_sum.data() + i) + Load4(s + i));
            for (; i < n; ++i) m_sum[i] += s[i];
        }
        Centre(m_sum.data(), m_weighted.data(), t, n, m);
        context.fft->ForwardReal(t, weighted + context.channels * context.bins);
        return;
    }
    for (std::size_t c = 0; c < context.channels; ++c) {
        Centre(m_frame.data() + c * n, m_weighted.data(), t, n, m);
        context.fft->ForwardReal(t, weighted + c * context.bins);
    }
}

}  // namespace ora::fft
