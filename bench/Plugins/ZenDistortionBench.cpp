#include "Support/Realtime.h"

// Stereo at the defaults ("Tube", 12 dB of drive), eight times oversampled.
static void BM_Distortion_Stereo48k(benchmark::State& state) { zenbench::RunPlugin(state, "Distortion", 2); }
BENCHMARK(BM_Distortion_Stereo48k);

// Every curve (0 "Tape" .. 3 "Fold-back") at the default drive and at full drive.
static void BM_Distortion_Curve_Stereo48k(benchmark::State& state) {
    const auto curve = static_cast<float>(state.range(0));
    const auto drive = static_cast<float>(state.range(1));
    zenbench::RunPlugin(state, "Distortion", 2, [&](AudioPlugin& plugin) {
        zenbench::Set(plugin, "Curve", curve);
        zenbench::Set(plugin, "Drive", drive);
    });
}
BENCHMARK(BM_Distortion_Curve_Stereo48k)->ArgsProduct({{0, 1, 2, 3}, {12, 36}})->ArgNames({"curve", "drive"});

// The fold-back curve driven hard, half dry.
static void BM_Distortion_FoldBackParallel_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Distortion", 2, [](AudioPlugin& plugin) {
        zenbench::Set(plugin, "Curve", 3.0f);
        zenbench::Set(plugin, "Drive", 30.0f);
        zenbench::Set(plugin, "Mix", 50.0f);
    });
}
BENCHMARK(BM_Distortion_FoldBackParallel_Stereo48k);
