// Downsampler in 256-bit vectors.
#include "Algorithms/simd/m256/VecM256.h"
#include "Algorithms/simd/VectorBodies.h"

namespace ora::numeric {

DownsamplerImpl* MakeDownsampler_m256() { return new simd::DownsamplerVec<VecM256>(); }

}  // namespace ora::numeric
