#include "Support/Realtime.h"

// Pink noise on both outputs of a stereo pair.
static void BM_Monitor_PinkNoiseStereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Monitor", 2, [](AudioPlugin& plugin) { zenbench::Set(plugin, "Output", 1.0f); });
}
BENCHMARK(BM_Monitor_PinkNoiseStereo48k);

// A sine walking through a 7.1.4 system.
static void BM_Monitor_SineWalk12Outputs48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Monitor", 12, [](AudioPlugin& plugin) { zenbench::Set(plugin, "Signal", 1.0f); });
}
BENCHMARK(BM_Monitor_SineWalk12Outputs48k);
