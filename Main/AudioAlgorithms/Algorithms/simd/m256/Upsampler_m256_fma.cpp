// Upsampler in 256-bit fused vectors.
#include "Algorithms/simd/m256/VecM256.h"
#include "Algorithms/simd/VectorBodies.h"

namespace ora::numeric {

UpsamplerImpl* MakeUpsampler_m256_fma() { return new simd::UpsamplerVec<VecM256Fma>(); }

}  // namespace ora::numeric
