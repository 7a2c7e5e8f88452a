#include "Support/Realtime.h"

// Driven 6 dB into the knee, so most samples take the tanh path.
static void BM_SoftClipper_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Soft Clipper", 2, [](AudioPlugin& plugin) {
        zenbench::Set(plugin, "Threshold", 6.0f);
        zenbench::Set(plugin, "Shape", 0.8f);
    });
}
BENCHMARK(BM_SoftClipper_Stereo48k);
