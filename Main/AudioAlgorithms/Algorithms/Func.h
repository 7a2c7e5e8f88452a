// Element-wise functions of blocks for meters, gains and saturation, fast
// and with stated errors against the double-precision std:: function, in
// units in the last place of the float result, over every float input:
//   Log10  within 4 ulp for x > 0, denormals included (scaled up before
//          their exponent is read); 0 -> -inf, x < 0 or NaN -> NaN,
//          +inf -> +inf. Method: x = 2^e m, ln m = 2 atanh((m - 1) / (m + 1))
//          to the 9th power.
//   Pow10  10^x within 2 ulp, denormal results included (dB to gain is
//          Pow10(dB / 20)); below -45.6 -> 0, above 38.53 -> +inf.
//   Exp    e^x within 2 ulp likewise; below -104 -> 0, above 88.72 -> +inf.
//          Method of both: x = k log 2 + r, |r| <= ln(2) / 2, e^r - 1 to r^7,
//          times 2^k in two steps so that denormal results round once.
//   Tanh   within 3 ulp; odd (-0 stays -0), denormals pass unchanged,
//          +-1 from |x| = 9.1 on and for +-inf. Method: E / (E + 2) with
//          E = e^(2|x|) - 1.
//   Sqrt   correctly rounded; x < 0 -> NaN, -0 -> -0, +inf -> +inf.
// NaN gives NaN everywhere. With denormals flushed (FTZ/DAZ, as during
// plug-in processing) denormal inputs read as 0 and denormal results are 0.
// The plain vector forms take the reference steps and agree with `ref` bit
// for bit; the fused forms round each multiply-add once and stay within
// 2 ulp of `ref`. Outputs may be inputs.
#pragma once

#include <cstddef>

#include "Algorithms/simd/FuncKernels.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

class Func {
public:
    Func();

    void Log10(const float* x, float* out, std::size_t n) const noexcept { m_kernels->log10(x, out, n); }
    void Pow10(const float* x, float* out, std::size_t n) const noexcept { m_kernels->pow10(x, out, n); }
    void Exp(const float* x, float* out, std::size_t n) const noexcept { m_kernels->exp(x, out, n); }
    void Tanh(const float* x, float* out, std::size_t n) const noexcept { m_kernels->tanh(x, out, n); }
    void Sqrt(const float* x, float* out, std::size_t n) const noexcept { m_kernels->sqrt(x, out, n); }

    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }

private:
    system::KernelForm m_form;
    const kernels::FuncKernels* m_kernels;
};

}  // namespace ora::numeric
