#include "Support/Realtime.h"

// Stereo has no LFE: "All" filters both channels, the 48 dB/oct design.
static void BM_LFEFilter_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "LFE Filter", 2, [](AudioPlugin& plugin) {
        zenbench::Set(plugin, "Channel", 1.0f);
        zenbench::Set(plugin, "Slope", 1.0f);
    });
}
BENCHMARK(BM_LFEFilter_Stereo48k);

// A 7.1.4 bed at the defaults: the LFE filtered, eleven channels passed.
static void BM_LFEFilter_7_1_4_48k(benchmark::State& state) { zenbench::RunPlugin(state, "LFE Filter", 12); }
BENCHMARK(BM_LFEFilter_7_1_4_48k);
