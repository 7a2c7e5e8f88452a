#include <vector>

#include "Support/Realtime.h"

// The default room, stereo, 512-frame blocks: at 48 kHz everything runs at
// the host's rate; at 96 kHz the reflections and tail run at 48 kHz between
// the polyphase converters.
static void BM_Reverb_Stereo48k(benchmark::State& state) { zenbench::RunPlugin(state, "Reverb", 2); }
BENCHMARK(BM_Reverb_Stereo48k);

static void BM_Reverb_Stereo96k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Reverb", 2, {}, 96000.0);
}
BENCHMARK(BM_Reverb_Stereo96k);

static void BM_Reverb_Stereo192k(benchmark::State& state) {
    zenbench::RunPlugin(state, "Reverb", 2, {}, 192000.0);
}
BENCHMARK(BM_Reverb_Stereo192k);

static void BM_Reverb_EightChannels48k(benchmark::State& state) { zenbench::RunPlugin(state, "Reverb", 8); }
BENCHMARK(BM_Reverb_EightChannels48k);

// The cost of silence a minute after an impulse, when every state has
// decayed as far as it goes: it must match the cost of noise (no denormals).
static void BM_Reverb_SilenceAMinuteAfterAnImpulse(benchmark::State& state) {
    zen::PluginInterface* library = GetZenPluginInterface();
    std::unique_ptr<zen::PluginInstance> instance;
    for (const auto& [key, entry] : library->GetPluginList(zen::kAudioPluginKind))
        if (entry.name == "Reverb") instance.reset(library->CreatePlugin(zen::kAudioPluginKind, key));
    AudioPlugin* audio = zen::InterfaceCast<AudioPlugin>(instance.get());
    if (audio == nullptr || !audio->ConfigureChannels(2, 2) || !audio->Prepare(48000.0f, zenbench::kBlock)) {
        state.SkipWithError("no reverb");
        return;
    }
    zenbench::Set(*audio, "T@-60dB", 20.0f);
    std::vector<std::vector<float>> work(2, std::vector<float>(zenbench::kBlock, 0.0f));
    float* pointers[] = {work[0].data(), work[1].data()};
    work[0][0] = work[1][0] = 1.0f;
    for (int block = 0; block < 60 * 48000 / static_cast<int>(zenbench::kBlock); ++block) {
        audio->Process(pointers, zenbench::kBlock);
        for (auto& channel : work) std::fill(channel.begin(), channel.end(), 0.0f);
    }
    for (auto _ : state) {
        audio->Process(pointers, zenbench::kBlock);
        benchmark::ClobberMemory();
    }
    zenbench::ReportRealtime(state, zenbench::kBlock);
}
BENCHMARK(BM_Reverb_SilenceAMinuteAfterAnImpulse);
