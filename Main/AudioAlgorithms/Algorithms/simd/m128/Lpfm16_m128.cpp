// Lpfm16 in 128-bit vectors.
#include "Algorithms/simd/m128/VecM128.h"
#include "Algorithms/simd/VectorBodies.h"

namespace ora::numeric {

Lpfm16Impl* MakeLpfm16_m128() { return new simd::Lpfm16Vec<VecM128>(); }

}  // namespace ora::numeric
