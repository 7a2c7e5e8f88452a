#include "Support/Realtime.h"

// Every stage in and every EQ band away from 0 dB.
static void BM_VocalChannel_AllStages_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Vocal Channel", 2, [](AudioPlugin& plugin) {
        zenbench::Set(plugin, "Gate", 1.0f);
        zenbench::Set(plugin, "Low Cut Slope", 1.0f);
        zenbench::Set(plugin, "Low Gain", -3.0f);
        zenbench::Set(plugin, "Mid Gain", 4.0f);
        zenbench::Set(plugin, "High Gain", 3.0f);
    });
}
BENCHMARK(BM_VocalChannel_AllStages_Stereo48k);

// The defaults: low cut, compressor and de-esser; the EQ flat.
static void BM_VocalChannel_Defaults_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Vocal Channel", 2);
}
BENCHMARK(BM_VocalChannel_Defaults_Stereo48k);
