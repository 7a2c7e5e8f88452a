// Inner loops of the true-peak families (UpsamplerTruePeak_x4, TruePeak),
// one per form. Free of intrinsics: the fronts include it, the vector
// sources define it.
#pragma once

#include <cstddef>

namespace ora::numeric::kernels {

// 4x oversampling through a polyphase filter of 4 phases of `taps` taps
// each (taps even). Phase 0 is the input itself, delayed by taps / 2 inputs;
// phases 1 to 3 interpolate at a quarter, a half and three quarters of a
// sample after it.
constexpr std::size_t kTruePeakFactor = 4;

// `run` holds taps - 1 inputs followed by `frames` new ones; `phases` the
// taps of phases 1, 2, 3, each last-first. Writes 4 * frames points.
using UpsampleTruePeakKernel = void (*)(const float* run, const float* phases, std::size_t taps, float* out,
                                        std::size_t frames);
// The largest magnitude of points[1..middles] (points[0] and
// points[middles + 1] are their outer neighbours), each local maximum raised
// to the vertex of the parabola through it and its neighbours, merged with
// `peak`.
using ScanTruePeakKernel = float (*)(const float* points, std::size_t middles, float peak);

void UpsamplerTruePeak_x4_ref(const float* run, const float* phases, std::size_t taps, float* out, std::size_t frames);
void UpsamplerTruePeak_x4_m128(const float* run, const float* phases, std::size_t taps, float* out, std::size_t frames);
void UpsamplerTruePeak_x4_m128_fma(const float* run, const float* phases, std::size_t taps, float* out,
                                   std::size_t frames);
void UpsamplerTruePeak_x4_m256(const float* run, const float* phases, std::size_t taps, float* out, std::size_t frames);
void UpsamplerTruePeak_x4_m256_fma(const float* run, const float* phases, std::size_t taps, float* out,
                                   std::size_t frames);

float TruePeakScan_ref(const float* points, std::size_t middles, float peak);
float TruePeakScan_m128(const float* points, std::size_t middles, float peak);
float TruePeakScan_m256(const float* points, std::size_t middles, float peak);

}  // namespace ora::numeric::kernels
