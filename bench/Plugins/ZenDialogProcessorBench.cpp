#include "Support/Realtime.h"

// Every stage in, at the amounts of a thorough clean-up and enhancement.
static void BM_DialogueProcessor_AllStages_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Dialogue Processor", 2, [](AudioPlugin& plugin) {
        for (const char* stage : {"Rumble Filt", "De-Pop", "De-Ess", "Expander", "Compressor", "Exciter"})
            zenbench::Set(plugin, stage, 1.0f);
        zenbench::Set(plugin, "De-Pop Amount", 0.85f);
        zenbench::Set(plugin, "De-Ess Amount", 0.65f);
        zenbench::Set(plugin, "Exp Amount", 0.55f);
        zenbench::Set(plugin, "Comp Amount", 0.5f);
    });
}
BENCHMARK(BM_DialogueProcessor_AllStages_Stereo48k);

// The defaults: rumble filter, de-pop, de-esser and compressor.
static void BM_DialogueProcessor_Defaults_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Dialogue Processor", 2);
}
BENCHMARK(BM_DialogueProcessor_Defaults_Stereo48k);
