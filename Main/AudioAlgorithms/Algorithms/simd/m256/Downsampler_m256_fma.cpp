// Downsampler in 256-bit fused vectors.
#include "Algorithms/simd/m256/VecM256.h"
#include "Algorithms/simd/VectorBodies.h"

namespace ora::numeric {

DownsamplerImpl* MakeDownsampler_m256_fma() { return new simd::DownsamplerVec<VecM256Fma>(); }

}  // namespace ora::numeric
