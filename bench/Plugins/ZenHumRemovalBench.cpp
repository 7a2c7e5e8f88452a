#include "Support/Realtime.h"

// Stereo at the defaults: 50 Hz and nine harmonics, tracking.
static void BM_DeHummer_Stereo48k(benchmark::State& state) { zenbench::RunPlugin(state, "De-Hummer", 2); }
BENCHMARK(BM_DeHummer_Stereo48k);

// Eight channels, twenty harmonics of 60 Hz.
static void BM_DeHummer_8ch_20Harmonics48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "De-Hummer", 8, [](AudioPlugin& plugin) {
        zenbench::Set(plugin, "Frequency", 1.0f);
        zenbench::Set(plugin, "Harmonics", 20.0f);
    });
}
BENCHMARK(BM_DeHummer_8ch_20Harmonics48k);
