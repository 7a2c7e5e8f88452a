// Downsampler in 128-bit fused vectors.
#include "Algorithms/simd/m128/VecM128.h"
#include "Algorithms/simd/VectorBodies.h"

namespace ora::numeric {

DownsamplerImpl* MakeDownsampler_m128_fma() { return new simd::DownsamplerVec<VecM128Fma>(); }

}  // namespace ora::numeric
