// Lpfm16 in 128-bit fused vectors.
#include "Algorithms/simd/m128/VecM128.h"
#include "Algorithms/simd/VectorBodies.h"

namespace ora::numeric {

Lpfm16Impl* MakeLpfm16_m128_fma() { return new simd::Lpfm16Vec<VecM128Fma>(); }

}  // namespace ora::numeric
