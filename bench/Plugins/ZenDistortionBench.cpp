#include "Support/Realtime.h"

// Stereo at the defaults ("Tube", 12 dB of drive), eight times oversampled.
static void BM_Distortion_Stereo48k(benchmark::State& state) { zenbench::RunPlugin(state, "Distortion", 2); }
BENCHMARK(BM_Distortion_Stereo48k);

// The fold-back curve driven hard, half dry.
static void BM_Distortion_FoldBackParallel_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Distortion", 2, [](AudioPlugin& plugin) {
        zenbench::Set(plugin, "Curve", 3.0f);
        zenbench::Set(plugin, "Drive", 30.0f);
        zenbench::Set(plugin, "Mix", 50.0f);
    });
}
BENCHMARK(BM_Distortion_FoldBackParallel_Stereo48k);
