// Inner loops of the Vec family (element-wise arithmetic), one table per
// form. Free of intrinsics. Outputs may be inputs. Clamp sends NaN to `lo`;
// Sanitize sends NaN and infinities to 0 and holds finite values at +-limit.
#pragma once

#include <cstddef>

namespace ora::numeric::kernels {

struct VecKernels {
    void (*add)(const float* a, const float* b, float* out, std::size_t n);
    void (*subtract)(const float* a, const float* b, float* out, std::size_t n);
    void (*multiply)(const float* a, const float* b, float* out, std::size_t n);
    void (*scale)(const float* a, float s, float* out, std::size_t n);
    void (*abs)(const float* a, float* out, std::size_t n);
    void (*clamp)(const float* a, float lo, float hi, float* out, std::size_t n);
    void (*sanitize)(const float* a, float limit, float* out, std::size_t n);
};

extern const VecKernels kVec_ref;
extern const VecKernels kVec_m128;
extern const VecKernels kVec_m256;

}  // namespace ora::numeric::kernels
