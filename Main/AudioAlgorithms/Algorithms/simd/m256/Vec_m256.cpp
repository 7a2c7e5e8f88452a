// Vec, 256-bit form.
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/VecKernels.h"
#include "Algorithms/simd/m256/VecM256.h"

namespace ora::numeric::kernels {

const VecKernels kVec_m256 = simd::VecTable<VecM256>();

}  // namespace ora::numeric::kernels
