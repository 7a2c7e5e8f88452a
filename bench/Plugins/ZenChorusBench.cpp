#include "Support/Realtime.h"

// The defaults: two voices per side.
static void BM_Chorus_Stereo48k(benchmark::State& state) { zenbench::RunPlugin(state, "Chorus", 2); }
BENCHMARK(BM_Chorus_Stereo48k);

// Four voices per side, the most the chorus reads.
static void BM_Chorus_4Voices_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Chorus", 2, [](AudioPlugin& plugin) { zenbench::Set(plugin, "Voices", 3.0f); });
}
BENCHMARK(BM_Chorus_4Voices_Stereo48k);
