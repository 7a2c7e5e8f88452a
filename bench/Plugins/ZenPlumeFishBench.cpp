#include "Support/Realtime.h"

static void BM_SurroundAnalyzer_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Surround Analyzer", 2);
}
BENCHMARK(BM_SurroundAnalyzer_Stereo48k);

static void BM_SurroundAnalyzer_Surround51_48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Surround Analyzer", 6);
}
BENCHMARK(BM_SurroundAnalyzer_Surround51_48k);
