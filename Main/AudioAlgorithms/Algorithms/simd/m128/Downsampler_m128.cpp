// Downsampler in 128-bit vectors.
#include "Algorithms/simd/m128/VecM128.h"
#include "Algorithms/simd/VectorBodies.h"

namespace ora::numeric {

DownsamplerImpl* MakeDownsampler_m128() { return new simd::DownsamplerVec<VecM128>(); }

}  // namespace ora::numeric
