#include "Support/Realtime.h"

// Full "Amount" on full-scale noise: the gain moves all the time.
static void BM_Deesser_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "De-Esser", 2, [](AudioPlugin& plugin) { zenbench::Set(plugin, "Amount", 100.0f); });
}
BENCHMARK(BM_Deesser_Stereo48k);
