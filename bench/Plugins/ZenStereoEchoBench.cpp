#include "Support/Realtime.h"

// The defaults: wow, flutter, the tape curve and the darkening loop on both channels.
static void BM_Echo_Stereo48k(benchmark::State& state) { zenbench::RunPlugin(state, "Echo", 2); }
BENCHMARK(BM_Echo_Stereo48k);
