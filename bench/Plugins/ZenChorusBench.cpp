#include "Support/Realtime.h"

// Four voices per side, the most the chorus reads.
static void BM_Chorus_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Chorus", 2, [](AudioPlugin& plugin) { zenbench::Set(plugin, "Voices", 3.0f); });
}
BENCHMARK(BM_Chorus_Stereo48k);
