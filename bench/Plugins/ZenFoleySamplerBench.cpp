#include <memory>

#include "Support/Realtime.h"

namespace {

// Triggers the pads in turn, one every `blocksPerTrigger` blocks of 512 at
// 48 kHz, into two outputs.
void RunSampler(benchmark::State& state, int blocksPerTrigger, float voices) {
    zen::PluginInterface* library = GetZenPluginInterface();
    std::unique_ptr<zen::PluginInstance> instance;
    for (const auto& [key, entry] : library->GetPluginList(zen::kAudioPluginKind))
        if (entry.name == "Foley Sampler") instance.reset(library->CreatePlugin(zen::kAudioPluginKind, key));
    AudioPlugin* audio = zen::InterfaceCast<AudioPlugin>(instance.get());
    if (audio == nullptr || !audio->ConfigureChannels(0, 2)) {
        state.SkipWithError("no Foley Sampler");
        return;
    }
    zenbench::Set(*audio, "Voices", voices);
    zenbench::Set(*audio, "Variation", 25.0f);
    audio->Prepare(static_cast<float>(zenbench::kSampleRate), zenbench::kBlock);
    std::vector<float> left(zenbench::kBlock), right(zenbench::kBlock);
    float* channels[] = {left.data(), right.data()};
    int block = 0, pad = 0;
    for (auto _ : state) {
        const bool fire = block++ % blocksPerTrigger == 0;
        if (fire) {
            zenbench::Set(*audio, "Pad", static_cast<float>(1 + pad++ % 11));
            zenbench::Set(*audio, "Trigger", 1.0f);
        }
        audio->Process(channels, zenbench::kBlock);
        if (fire) zenbench::Set(*audio, "Trigger", 0.0f);
        benchmark::ClobberMemory();
    }
    zenbench::ReportRealtime(state, zenbench::kBlock);
}

}  // namespace

// A busy scene: a sound every 107 ms, several overlapping.
static void BM_FoleySampler_Stereo48k(benchmark::State& state) { RunSampler(state, 10, 32.0f); }
BENCHMARK(BM_FoleySampler_Stereo48k);

// The worst case: a trigger every other block (the trigger falls in between),
// 64 voices sounding.
static void BM_FoleySampler_64Voices_Stereo48k(benchmark::State& state) { RunSampler(state, 2, 64.0f); }
BENCHMARK(BM_FoleySampler_64Voices_Stereo48k);
