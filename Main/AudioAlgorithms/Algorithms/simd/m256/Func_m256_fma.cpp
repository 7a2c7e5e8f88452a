// Func, 256-bit fused multiply-add form.
#include "Algorithms/simd/FuncKernels.h"
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/m256/VecM256.h"

namespace ora::numeric::kernels {

const FuncKernels kFunc_m256_fma = simd::FuncTable<VecM256Fma>();

}  // namespace ora::numeric::kernels
