#include "Algorithms/Vec.h"

#include <cmath>
#include <limits>

namespace ora::numeric {

namespace kernels {

namespace {

void Add(const float* a, const float* b, float* out, std::size_t n) {
    for (std::size_t i = 0; i < n; ++i) out[i] = a[i] + b[i];
}

void Subtract(const float* a, const float* b, float* out, std::size_t n) {
    for (std::size_t i = 0; i < n; ++i) out[i] = a[i] - b[i];
}

void Multiply(const float* a, const float* b, float* out, std::size_t n) {
    for (std::size_t i = 0; i < n; ++i) out[i] = a[i] * b[i];
}

void Scale(const float* a, float s, float* out, std::size_t n) {
    for (std::size_t i = 0; i < n; ++i) out[i] = a[i] * s;
}

void Abs(const float* a, float* out, std::size_t n) {
    for (std::size_t i = 0; i < n; ++i) out[i] = std::fabs(a[i]);
}

void Clamp(const float* a, float lo, float hi, float* out, std::size_t n) {
    for (std::size_t i = 0; i < n; ++i) {
        const float v = a[i] > lo ? a[i] : lo;
        out[i] = v < hi ? v : hi;
    }
}

void Sanitize(const float* a, float limit, float* out, std::size_t n) {
    for (std::size_t i = 0; i < n; ++i) {
        const float magnitude = std::fabs(a[i]);
        // Both comparisons are false for NaN.
        if (magnitude <= limit) out[i] = a[i];
        else out[i] = magnitude <= std::numeric_limits<float>::max() ? std::copysign(limit, a[i]) : 0.0f;
    }
}

}  // namespace

const VecKernels kVec_ref = {Add, Subtract, Multiply, Scale, Abs, Clamp, Sanitize};

}  // namespace kernels

namespace {

const kernels::VecKernels* FormKernels(system::KernelForm form) {
    switch (form) {
        case system::KernelForm::M256: return &kernels::kVec_m256;
        case system::KernelForm::M128: return &kernels::kVec_m128;
        default: return &kernels::kVec_ref;
    }
}

}  // namespace

Vec::Vec() : m_form(system::ChooseKernelFormWithoutFma()), m_kernels(FormKernels(m_form)) {}

}  // namespace ora::numeric
