#include "Algorithms/Blas1.h"

#include <cmath>

namespace ora::numeric {

namespace kernels {

float Dot_ref(const float* x, const float* y, std::size_t n) {
    constexpr std::size_t kPartials = 8;
    float s[kPartials] = {};
    const std::size_t whole = n - n % kPartials;
    for (std::size_t i = 0; i < whole; ++i) s[i % kPartials] += x[i] * y[i];
    const float t0 = s[0] + s[4], t1 = s[1] + s[5], t2 = s[2] + s[6], t3 = s[3] + s[7];
    float sum = (t0 + t2) + (t1 + t3);
    for (std::size_t i = whole; i < n; ++i) sum += x[i] * y[i];
    return sum;
}

void Axpy_ref(float a, const float* x, float* y, std::size_t n) {
    for (std::size_t i = 0; i < n; ++i) y[i] += a * x[i];
}

}  // namespace kernels

Blas1::Blas1() : m_form(system::ChooseKernelFormWithoutFma()) {
    switch (m_form) {
        case system::KernelForm::M256:
            m_dot = kernels::Dot_m256;
            m_axpy = kernels::Axpy_m256;
            break;
        case system::KernelForm::M128:
            m_dot = kernels::Dot_m128;
            m_axpy = kernels::Axpy_m128;
            break;
        default:
            m_dot = kernels::Dot_ref;
            m_axpy = kernels::Axpy_ref;
            break;
    }
}

float Blas1::Norm2(const float* x, std::size_t n) const noexcept { return std::sqrt(Dot(x, x, n)); }

}  // namespace ora::numeric
