#include "Support/Realtime.h"

// Defaults: the offset measured all along, alignment by the delay lines.
static void BM_StereoFixer_AutoAlign48k(benchmark::State& state) { zenbench::RunPlugin(state, "Stereo Fixer", 2); }
BENCHMARK(BM_StereoFixer_AutoAlign48k);

// Everything on: polarity, balance, automatic fold-down.
static void BM_StereoFixer_AllRepairs48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Stereo Fixer", 2, [](AudioPlugin& plugin) {
        zenbench::Set(plugin, "Right Polarity", 1.0f);
        zenbench::Set(plugin, "Balance", 3.0f);
        zenbench::Set(plugin, "Mono Fold-Down", 1.0f);
    });
}
BENCHMARK(BM_StereoFixer_AllRepairs48k);
