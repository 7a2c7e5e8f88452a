#include "Support/Realtime.h"

// The defaults (four bands) on full-scale noise: every band compresses.
static void BM_MultibandCompressor_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Multiband Compressor", 2);
}
BENCHMARK(BM_MultibandCompressor_Stereo48k);

// All five bands and a look-ahead.
static void BM_MultibandCompressor_FiveBands_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Multiband Compressor", 2, [](AudioPlugin& plugin) {
        zenbench::Set(plugin, "Bands", 5.0f);
        zenbench::Set(plugin, "Lookahead", 3.0f);
    });
}
BENCHMARK(BM_MultibandCompressor_FiveBands_Stereo48k);
