// Lpfm16 in 256-bit vectors.
#include "Algorithms/simd/m256/VecM256.h"
#include "Algorithms/simd/VectorBodies.h"

namespace ora::numeric {

Lpfm16Impl* MakeLpfm16_m256() { return new simd::Lpfm16Vec<VecM256>(); }

}  // namespace ora::numeric
