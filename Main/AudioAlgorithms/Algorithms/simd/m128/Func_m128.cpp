// Func, 128-bit form.
#include "Algorithms/simd/FuncKernels.h"
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/m128/VecM128.h"

namespace ora::numeric::kernels {

const FuncKernels kFunc_m128 = simd::FuncTable<VecM128>();

}  // namespace ora::numeric::kernels
