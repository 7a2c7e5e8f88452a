// Lpf16 in 128-bit vectors.
#include "Algorithms/simd/m128/VecM128.h"
#include "Algorithms/simd/VectorBodies.h"

namespace ora::numeric {

Lpf16Impl* MakeLpf16_m128() { return new simd::Lpf16Vec<VecM128>(); }

}  // namespace ora::numeric
