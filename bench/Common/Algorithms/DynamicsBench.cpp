// Realtime factors of the filter and detector primitives, 48 kHz, 512-frame blocks.
#include <algorithm>
#include <cstdint>
#include <vector>

#include "Common/Algorithms/BiQuad.h"
#include "Common/Algorithms/Limiter.h"
#include "Common/Algorithms/RmsCompressor.h"
#include "Support/Realtime.h"

namespace {

// A second of full-scale noise per channel, walked block by block so the input keeps changing.
struct NoiseSource {
    explicit NoiseSource(std::uint32_t channels)
        : source(channels, std::vector<float>(static_cast<std::size_t>(zenbench::kSampleRate))),
          work(channels, std::vector<float>(zenbench::kBlock)) {
        std::uint32_t seed = 12345;
        for (auto& channel : source)
            for (float& v : channel) {
                seed = seed * 1664525u + 1013904223u;
                v = static_cast<float>(seed) / 2147483648.0f - 1.0f;
            }
        for (auto& channel : work) pointers.push_back(channel.data());
    }
    float* const* Next() {
        for (std::size_t c = 0; c < work.size(); ++c)
            std::copy_n(source[c].begin() + static_cast<std::ptrdiff_t>(position), zenbench::kBlock, work[c].begin());
        position = (position + zenbench::kBlock) % (source[0].size() - zenbench::kBlock);
        return pointers.data();
    }
    std::vector<std::vector<float>> source, work;
    std::vector<float*> pointers;
    std::size_t position = 0;
};

}  // namespace

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
