// Upsampler in 128-bit vectors.
#include "Algorithms/simd/m128/VecM128.h"
#include "Algorithms/simd/VectorBodies.h"

namespace ora::numeric {

UpsamplerImpl* MakeUpsampler_m128() { return new simd::UpsamplerVec<VecM128>(); }

}  // namespace ora::numeric
