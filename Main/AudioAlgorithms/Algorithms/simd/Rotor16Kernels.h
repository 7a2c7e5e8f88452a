// Inner loops of the Rotor16 family, one per form. Free of intrinsics.
#pragma once

#include <cstddef>

namespace ora::numeric {

// The phasors (c, s) and each lane's rotation per frame (rc, rs) = (cos w, sin w).
struct alignas(64) Rotor16State {
    float c[16] = {};
    float s[16] = {};
    float rc[16] = {};
    float rs[16] = {};
};

namespace kernels {

using Rotor16Kernel = void (*)(Rotor16State& state, float* sines, std::size_t frames);

void Rotor16_ref(Rotor16State& state, float* sines, std::size_t frames);
void Rotor16_m128(Rotor16State& state, float* sines, std::size_t frames);
void Rotor16_m256(Rotor16State& state, float* sines, std::size_t frames);

}  // namespace kernels

}  // namespace ora::numeric
