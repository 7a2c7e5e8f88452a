// Inner loops of the Func family (element-wise functions), one table per
// form. Free of intrinsics. Outputs may be inputs.
#pragma once

#include <cstddef>

namespace ora::numeric::kernels {

struct FuncKernels {
    void (*log10)(const float* x, float* out, std::size_t n);
    void (*pow10)(const float* x, float* out, std::size_t n);
    void (*exp)(const float* x, float* out, std::size_t n);
    void (*tanh)(const float* x, float* out, std::size_t n);
    void (*sqrt)(const float* x, float* out, std::size_t n);
};

extern const FuncKernels kFunc_ref;
extern const FuncKernels kFunc_m128;
extern const FuncKernels kFunc_m128_fma;
extern const FuncKernels kFunc_m256;
extern const FuncKernels kFunc_m256_fma;

}  // namespace ora::numeric::kernels
