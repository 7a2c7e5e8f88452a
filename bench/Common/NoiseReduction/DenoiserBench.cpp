// Realtime factors of the spectral denoiser per channel (channel-seconds of
// audio per CPU second) at 48 kHz in 512-frame blocks: adaptive, with a learnt profile, and voice guided (the
// voice-activity detector included).
#include <algorithm>
#include <cstdint>
#include <vector>

#include "Common/NoiseReduction/zn_denoiser.h"
#include "Support/Realtime.h"

namespace {

namespace nr = zen::noise_reduction;

// Noise a little below full scale with a slow swell, walked block by block.
std::vector<float> Material(std::uint32_t channels) {
    std::vector<float> x(static_cast<std::size_t>(zenbench::kSampleRate) * channels);
    std::uint32_t seed = 12345;
    for (std::size_t i = 0; i < x.size(); ++i) {
        seed = seed * 1664525u + 1013904223u;
        x[i] = (static_cast<float>(seed) / 2147483648.0f - 1.0f) * 0.25f * (1.0f + static_cast<float>(i % 24000) / 24000.0f);
    }
    return x;
}

void Run(benchmark::State& state, std::uint32_t channels, nr::zn_denoise_settings settings, bool learn) {
    nr::zn_denoiser denoiser;
    denoiser.SetChannelCount(channels);
    denoiser.Prepare(static_cast<float>(zenbench::kSampleRate), zenbench::kBlock);
    const std::vector<float> source = Material(channels);
    std::vector<std::vector<float>> work(channels, std::vector<float>(zenbench::kBlock));
    std::vector<float*> pointers;
    for (auto& w : work) pointers.push_back(w.data());
    std::size_t position = 0;
    const auto next = [&]() {
        for (std::uint32_t c = 0; c < channels; ++c)
            for (std::size_t i = 0; i < zenbench::kBlock; ++i)
                work[c][i] = source[(position + i) * channels % source.size() + c];
        position = (position + zenbench::kBlock) % (source.size() / channels - zenbench::kBlock);
    };
    if (learn) {
        settings.learning = true;
        denoiser.Configure(settings);
        for (int i = 0; i < 50; ++i) {
            next();
            denoiser.Process(pointers.data(), zenbench::kBlock);
        }
        settings.learning = false;
    }
    denoiser.Configure(settings);
    for (auto _ : state) {
        next();
        denoiser.Process(pointers.data(), zenbench::kBlock);
        benchmark::ClobberMemory();
    }
    // Audio seconds of one channel per CPU second, summed over the channels.
    zenbench::ReportRealtime(state, static_cast<double>(zenbench::kBlock) * channels);
}

}  // namespace

static void BM_Denoiser_Adaptive_Mono48k(benchmark::State& state) {
    Run(state, 1, nr::zn_denoise_settings{}, false);
}
BENCHMARK(BM_Denoiser_Adaptive_Mono48k);

static void BM_Denoiser_Learned_Stereo48k(benchmark::State& state) {
    nr::zn_denoise_settings s;
    s.estimate = nr::zn_denoise_settings::Estimate::Learned;
    Run(state, 2, s, true);
}
BENCHMARK(BM_Denoiser_Learned_Stereo48k);

static void BM_Denoiser_VoiceGuided_Stereo48k(benchmark::State& state) {
    nr::zn_denoise_settings s;
    s.voiceGuided = true;
    Run(state, 2, s, false);
}
BENCHMARK(BM_Denoiser_VoiceGuided_Stereo48k);
