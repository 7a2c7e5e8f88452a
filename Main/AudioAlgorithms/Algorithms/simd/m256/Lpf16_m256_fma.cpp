// Lpf16 in 256-bit fused vectors.
#include "Algorithms/simd/m256/VecM256.h"
#include "Algorithms/simd/VectorBodies.h"

namespace ora::numeric {

Lpf16Impl* MakeLpf16_m256_fma() { return new simd::Lpf16Vec<VecM256Fma>(); }

}  // namespace ora::numeric
