// Lpf16 in 256-bit vectors.
#include "Algorithms/simd/m256/VecM256.h"
#include "Algorithms/simd/VectorBodies.h"

namespace ora::numeric {

Lpf16Impl* MakeLpf16_m256() { return new simd::Lpf16Vec<VecM256>(); }

}  // namespace ora::numeric
