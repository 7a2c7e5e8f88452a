#include "FFT/Window.h"

#include <cmath>

#include "System/Check.h"

namespace ora::fft {

void Window::Hann(float* win, std::size_t len) {
    const double step = 2.0 * M_PI / static_cast<double>(len);
    for (std::size_t n = 0; n < len; ++n) win[n] = static_cast<float>(0.5 - 0.5 * std::cos(step * static_cast<double>(n)));
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
