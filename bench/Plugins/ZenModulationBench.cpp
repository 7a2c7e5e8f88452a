#include "Support/Realtime.h"

// The phaser at its heaviest: twelve sections redesigned every sample.
static void BM_Modulation_Phaser12_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Modulation", 2, [](AudioPlugin& plugin) { zenbench::Set(plugin, "Stages", 4.0f); });
}
BENCHMARK(BM_Modulation_Phaser12_Stereo48k);

static void BM_Modulation_Vibrato_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Modulation", 2, [](AudioPlugin& plugin) { zenbench::Set(plugin, "Mode", 2.0f); });
}
BENCHMARK(BM_Modulation_Vibrato_Stereo48k);
