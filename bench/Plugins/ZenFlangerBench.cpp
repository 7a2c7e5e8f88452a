#include "Support/Realtime.h"

// The defaults: a triangle sweep with 50 % feedback through the loop's cut and limiter.
static void BM_Flanger_Stereo48k(benchmark::State& state) { zenbench::RunPlugin(state, "Flanger", 2); }
BENCHMARK(BM_Flanger_Stereo48k);
