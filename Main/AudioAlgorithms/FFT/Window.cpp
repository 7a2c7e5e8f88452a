#include "FFT/Window.h"

#include <cmath>

#include "System/Check.h"

namespace ora::fft {

void Window::Hann(float* win, std::size_t len) {
    const double step = 2.0 * M_PI / static_cast<double>(len);
    for (std::size_t n = 0; n < len; ++n) win[n] = static_cast<float>(0.5 - 0.5 * std::cos(step * static_cast<double>(n)));
}

namespace {

// Sum of cosines a0 - a1 cos(x) + a2 cos(2x) - ... over one period.
template <std::size_t N>
void CosineSum(float* win, std::size_t len, const double (&a)[N]) {
    const double step = 2.0 * M_PI / static_cast<double>(len);
    for (std::size_t n = 0; n < len; ++n) {
        double v = 0.0;
        for (std::size_t k = 0; k < N; ++k)
            v += (k % 2 == 0 ? a[k] : -a[k]) * std::cos(step * static_cast<double>(k * n));
        win[n] = static_cast<float>(v);
    }
}

}  // namespace

void Window::Rectangular(float* win, std::size_t len) {
    for (std::size_t n = 0; n < len; ++n) win[n] = 1.0f;
}

void Window::BlackmanHarris(float* win, std::size_t len) {
    static constexpr double a[] = {0.35875, 0.48829, 0.14128, 0.01168};
    CosineSum(win, len, a);
}

void Window::FlatTop(float* win, std::size_t len) {
    static constexpr double a[] = {0.21557895, 0.41663158, 0.277263158, 0.083578947, 0.006947368};
    CosineSum(win, len, a);
}

bool Window::MakePair(float* win, float* win_dual, std::size_t len, std::size_t stride) {
    if (!ORA_CHECK((win != nullptr) && (win_dual != nullptr) && (stride > 0u) && (len > 0u))) return false;
    Hann(win, len);
    // Dual = window / (sum of the squared windows that overlap at each sample).
    for (std::size_t n = 0; n < len; ++n) {
        double energy = 0.0;
        for (std::size_t m = n % stride; m < len; m += stride) energy += static_cast<double>(win[m]) * win[m];
        win_dual[n] = energy > 1e-12 ? static_cast<float>(win[n] / energy) : 0.0f;
    }
    return true;
}

bool Window::Build(std::size_t len, std::size_t stride) {
    m_win.Resize(len);
    m_dual.Resize(len);
    return MakePair(m_win.data(), m_dual.data(), len, stride);
}

}  // namespace ora::fft
