// Vec, 128-bit form.
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/VecKernels.h"
#include "Algorithms/simd/m128/VecM128.h"

namespace ora::numeric::kernels {

const VecKernels kVec_m128 = simd::VecTable<VecM128>();

}  // namespace ora::numeric::kernels
