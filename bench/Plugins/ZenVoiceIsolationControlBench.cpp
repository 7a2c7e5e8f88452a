#include "Support/Realtime.h"

// Defaults on full-scale noise: the voice-activity detector runs on the
// channels' mean beside the spectral path.
static void BM_VoiceIsolation_Stereo48k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Voice Isolation", 2);
}
BENCHMARK(BM_VoiceIsolation_Stereo48k);
