#include "Support/Realtime.h"

// Correlation, balance, mid/side and a goniometer point per sample.
static void BM_PhaseMeter_Stereo48k(benchmark::State& state) { zenbench::RunPlugin(state, "Phase Meter", 2); }
BENCHMARK(BM_PhaseMeter_Stereo48k);
