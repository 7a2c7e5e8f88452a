// Func, 256-bit form.
#include "Algorithms/simd/FuncKernels.h"
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/m256/VecM256.h"

namespace ora::numeric::kernels {

const FuncKernels kFunc_m256 = simd::FuncTable<VecM256>();

}  // namespace ora::numeric::kernels
