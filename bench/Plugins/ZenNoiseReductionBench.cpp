#include "Support/Realtime.h"

// Defaults on full-scale noise; per channel the realtime factor is twice
// the stereo one.
static void BM_NoiseReduction_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Noise Reduction", 2);
}
BENCHMARK(BM_NoiseReduction_Stereo48k);

static void BM_NoiseReduction_Learned_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Noise Reduction", 2, [](AudioPlugin& plugin) {
        zenbench::Set(plugin, "Learn", 1.0f);
        zenbench::Set(plugin, "Estimate", 1.0f);
    });
}
BENCHMARK(BM_NoiseReduction_Learned_Stereo48k);
