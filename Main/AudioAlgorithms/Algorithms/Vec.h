// Element-wise arithmetic over buffers. The form is chosen when the front is
// built; outputs may be inputs. Every form gives the reference result bit
// for bit.
#pragma once

#include <cstddef>

#include "Algorithms/simd/VecKernels.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

class Vec {
public:
    Vec();

    // out = a + b, a - b, a * b
    void Add(const float* a, const float* b, float* out, std::size_t n) const noexcept { m_kernels->add(a, b, out, n); }
    void Subtract(const float* a, const float* b, float* out, std::size_t n) const noexcept {
        m_kernels->subtract(a, b, out, n);
    }
    void Multiply(const float* a, const float* b, float* out, std::size_t n) const noexcept {
        m_kernels->multiply(a, b, out, n);
    }
    // out = a * s
    void Scale(const float* a, float s, float* out, std::size_t n) const noexcept { m_kernels->scale(a, s, out, n); }
    // out = |a|
    void Abs(const float* a, float* out, std::size_t n) const noexcept { m_kernels->abs(a, out, n); }
    // out = min(max(a, lo), hi); NaN becomes lo.
    void Clamp(const float* a, float lo, float hi, float* out, std::size_t n) const noexcept {
        m_kernels->clamp(a, lo, hi, out, n);
    }
    // out = a where |a| <= limit, +-limit for larger finite values, 0 for NaN
    // and infinities. `limit` is positive and finite.
    void Sanitize(const float* a, float limit, float* out, std::size_t n) const noexcept {
        m_kernels->sanitize(a, limit, out, n);
    }

    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }

private:
    system::KernelForm m_form;
    const kernels::VecKernels* m_kernels;
};

}  // namespace ora::numeric
