// Func, 128-bit fused multiply-add form.
#include "Algorithms/simd/FuncKernels.h"
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/m128/VecM128.h"

namespace ora::numeric::kernels {

const FuncKernels kFunc_m128_fma = simd::FuncTable<VecM128Fma>();

}  // namespace ora::numeric::kernels
