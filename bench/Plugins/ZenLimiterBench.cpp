#include "Support/Realtime.h"

// Full-scale noise against a -1 dBTP ceiling: the gain moves in every block.
static void BM_Limiter_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Limiter", 2, [](AudioPlugin& plugin) {
        zenbench::Set(plugin, "Ceiling", -1.0f);
        zenbench::Set(plugin, "Input Gain", 6.0f);
    });
}
BENCHMARK(BM_Limiter_Stereo48k);

static void BM_Limiter_Soft_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Limiter", 2, [](AudioPlugin& plugin) {
        zenbench::Set(plugin, "Ceiling", -1.0f);
        zenbench::Set(plugin, "Input Gain", 6.0f);
        zenbench::Set(plugin, "Soft", 1.0f);
    });
}
BENCHMARK(BM_Limiter_Soft_Stereo48k);
