#include "Support/Realtime.h"

// Default settings (PGHI, Auto, joint) a fourth up.
static void BM_Pitch_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Pitch", 2, [](AudioPlugin& plugin) { zenbench::Set(plugin, "Semitones", 5.0f); });
}
BENCHMARK(BM_Pitch_Stereo48k);
