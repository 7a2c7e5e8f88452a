#include "Support/Realtime.h"

// Wider than the source, on the per-frame path.
static void BM_StereoWidth_Wide48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Stereo Width", 2, [](AudioPlugin& plugin) { zenbench::Set(plugin, "Width", 150.0f); });
}
BENCHMARK(BM_StereoWidth_Wide48k);

// Mono bass: mid and side through the crossover.
static void BM_StereoWidth_MonoBass48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Stereo Width", 2, [](AudioPlugin& plugin) {
        zenbench::Set(plugin, "Width", 150.0f);
        zenbench::Set(plugin, "Mono Bass", 1.0f);
    });
}
BENCHMARK(BM_StereoWidth_MonoBass48k);
