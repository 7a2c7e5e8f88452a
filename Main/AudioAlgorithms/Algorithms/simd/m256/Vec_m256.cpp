// Vec, 256-bit form.
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/VecKernels.h"
#include "Algorithms/simd/m256/VecM256.h"

namespace ora::numeric::kernels {

const VecKernels kVec_m256 = {simd::Add<VecM256>,   simd::Subtract<VecM256>, simd::Multiply<VecM256>,
                             simd::Scale<VecM256>, simd::Abs<VecM256>,      simd::Clamp<VecM256>};

}  // namespace ora::numeric::kernels
