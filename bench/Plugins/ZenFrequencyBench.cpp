#include "Support/Realtime.h"

// The default 4096-point frames every 1024 samples, each channel on its own.
static void BM_FrequencyAnalyzer_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Frequency Analyzer", 2);
}
BENCHMARK(BM_FrequencyAnalyzer_Stereo48k);

// The smallest frames come most often: every 256 samples.
static void BM_FrequencyAnalyzer_Stereo48k_Size1024(benchmark::State& state) {
    zenbench::RunPlugin(state, "Frequency Analyzer", 2, [](AudioPlugin& plugin) { zenbench::Set(plugin, "Size", 0.0f); });
}
BENCHMARK(BM_FrequencyAnalyzer_Stereo48k_Size1024);
