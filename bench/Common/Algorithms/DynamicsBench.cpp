// Realtime factors of the filter and detector primitives, 48 kHz, 512-frame blocks.
#include <algorithm>
#include <cstdint>
#include <vector>

#include "Common/Algorithms/BiQuad.h"
#include "Common/Algorithms/Limiter.h"
#include "Common/Algorithms/LinkwitzRileyCrossover.h"
#include "Common/Algorithms/RmsCompressor.h"
#include "Support/NoiseSource.h"
#include "Support/Realtime.h"

using zenbench::NoiseSource;

// One channel of a bell; a section's cost per channel.
static void BM_BiQuad_PerChannel48k(benchmark::State& state) {
    BiQuad filter;
    filter.SetChannelCount(1);
    filter.Prepare(static_cast<float>(zenbench::kSampleRate), zenbench::kBlock);
    filter.SetParameter(BiQuad::kShape, static_cast<float>(BiQuad::kBell));
    filter.SetParameter(BiQuad::kGain, 6.0f);
    filter.SetParameter(BiQuad::kIn, 1.0f);
    NoiseSource input(1);
    for (auto _ : state) {
        filter.Process(input.Next(), zenbench::kBlock);
        benchmark::ClobberMemory();
    }
    zenbench::ReportRealtime(state, zenbench::kBlock);
}
BENCHMARK(BM_BiQuad_PerChannel48k);

// Stereo, compressing full-scale noise through the knee.
static void BM_RmsCompressor_Stereo48k(benchmark::State& state) {
    RmsCompressor compressor;
    compressor.SetChannelCount(2);
    compressor.Prepare(static_cast<float>(zenbench::kSampleRate), zenbench::kBlock);
    compressor.SetParameter(RmsCompressor::kThreshold, -20.0f);
    compressor.SetParameter(RmsCompressor::kRatio, 4.0f);
    NoiseSource input(2);
    for (auto _ : state) {
        compressor.Process(input.Next(), zenbench::kBlock);
        benchmark::ClobberMemory();
    }
    zenbench::ReportRealtime(state, zenbench::kBlock);
}
BENCHMARK(BM_RmsCompressor_Stereo48k);

// Stereo full-scale noise against a -1 dBTP ceiling: a new target every block.
static void BM_LimiterAlgorithm_Stereo48k(benchmark::State& state) {
    Limiter limiter;
    limiter.SetChannelCount(2);
    limiter.Prepare(static_cast<float>(zenbench::kSampleRate), zenbench::kBlock);
    limiter.SetParameter(Limiter::kCeiling, -1.0f);
    NoiseSource input(2);
    for (auto _ : state) {
        limiter.Process(input.Next(), zenbench::kBlock);
        benchmark::ClobberMemory();
    }
    zenbench::ReportRealtime(state, zenbench::kBlock);
}
BENCHMARK(BM_LimiterAlgorithm_Stereo48k);

// A stereo five-band split and its sum, the crossover alone.
static void BM_LinkwitzRileyCrossover_FiveBands_Stereo48k(benchmark::State& state) {
    LinkwitzRileyCrossover crossover;
    crossover.SetChannelCount(2);
    crossover.Prepare(static_cast<float>(zenbench::kSampleRate), zenbench::kBlock);
    crossover.SetParameter(LinkwitzRileyCrossover::kBands, 5.0f);
    NoiseSource input(2);
    for (auto _ : state) {
        crossover.Process(input.Next(), zenbench::kBlock);
        benchmark::ClobberMemory();
    }
    zenbench::ReportRealtime(state, zenbench::kBlock);
}
BENCHMARK(BM_LinkwitzRileyCrossover_FiveBands_Stereo48k);
