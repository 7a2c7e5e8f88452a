#include "Support/Realtime.h"

// Ping-pong with 60 % feedback through both cuts: every sample reads,
// filters and limits both lines.
static void BM_Delay_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Delay", 2, [](AudioPlugin& plugin) {
        zenbench::Set(plugin, "Feedback", 60.0f);
        zenbench::Set(plugin, "Ping-Pong", 1.0f);
        zenbench::Set(plugin, "Mix", 50.0f);
    });
}
BENCHMARK(BM_Delay_Stereo48k);
