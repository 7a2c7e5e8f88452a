#include "Support/Realtime.h"

// Loudness, true peak (4x) and RMS of every channel; true peak on, the default.
static void BM_Meter_Stereo48k(benchmark::State& state) { zenbench::RunPlugin(state, "Meter", 2); }
BENCHMARK(BM_Meter_Stereo48k);

static void BM_Meter_Surround51_48k(benchmark::State& state) { zenbench::RunPlugin(state, "Meter", 6); }
BENCHMARK(BM_Meter_Surround51_48k);

static void BM_Meter_Stereo48k_TruePeakOff(benchmark::State& state) {
    zenbench::RunPlugin(state, "Meter", 2, [](AudioPlugin& plugin) { zenbench::Set(plugin, "True Peak", 0.0f); });
}
BENCHMARK(BM_Meter_Stereo48k_TruePeakOff);
