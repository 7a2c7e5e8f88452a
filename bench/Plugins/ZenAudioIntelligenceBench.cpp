#include "Support/Realtime.h"

// Levelling on and applying: the speech measurement (K-weighting and the
// voice detector every 10 ms) and the smoothed gain, without a host engine.
static void BM_AudioIntelligence_Levelling_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "AI", 2, [](AudioPlugin& plugin) {
        zenbench::Set(plugin, "Levelling", 1.0f);
        zenbench::Set(plugin, "Apply Gain List", 1.0f);
    });
}
BENCHMARK(BM_AudioIntelligence_Levelling_Stereo48k);

// Levelling off: the gain list's pass-through path.
static void BM_AudioIntelligence_Idle_Stereo48k(benchmark::State& state) { zenbench::RunPlugin(state, "AI", 2); }
BENCHMARK(BM_AudioIntelligence_Idle_Stereo48k);
