// Upsampler in 128-bit fused vectors.
#include "Algorithms/simd/m128/VecM128.h"
#include "Algorithms/simd/VectorBodies.h"

namespace ora::numeric {

UpsamplerImpl* MakeUpsampler_m128_fma() { return new simd::UpsamplerVec<VecM128Fma>(); }

}  // namespace ora::numeric
