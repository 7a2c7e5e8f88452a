#include "Support/Realtime.h"

#include <cstdint>
#include <stdexcept>

namespace zenbench {

void ReportRealtime(benchmark::State& state, double framesPerIteration, double sampleRate) {
    state.counters["realtime"] = benchmark::Counter(static_cast<double>(state.iterations()) * framesPerIteration / sampleRate,
                                                    benchmark::Counter::kIsRate);
}

void Set(AudioPlugin& plugin, const char* labelOrIdentifier, float value) {
    auto* controls = dynamic_cast<ZenControlValueHost*>(&plugin);
    const std::int32_t index = controls != nullptr ? controls->FindParameter(labelOrIdentifier) : -1;
    if (index < 0 || !plugin.SetParameter(static_cast<std::uint32_t>(index), value))
        throw std::runtime_error(std::string("cannot set ") + labelOrIdentifier);
}

void RunPlugin(benchmark::State& state, const std::string& name, std::uint32_t channels,
               const std::function<void(AudioPlugin&)>& setup, double sampleRate) {
    zen::PluginInterface* library = GetZenPluginInterface();
    std::unique_ptr<zen::PluginInstance> instance;
    for (const auto& [key, entry] : library->GetPluginList(zen::kAudioPluginKind))
        if (entry.name == name) instance.reset(library->CreatePlugin(zen::kAudioPluginKind, key));
    AudioPlugin* audio = zen::InterfaceCast<AudioPlugin>(instance.get());
    if (audio == nullptr) {
        state.SkipWithError(("no plug-in " + name).c_str());
        return;
    }
    if (setup) setup(*audio);
    // A source (no audio input) takes the channels as outputs only.
    const bool configured = audio->ConfigureChannels(channels, channels) || audio->ConfigureChannels(0, channels);
    if (!configured || !audio->Prepare(static_cast<float>(sampleRate), kBlock)) {
        state.SkipWithError("layout or preparation refused");
        return;
    }
    // A second of noise, walked block by block, so the input keeps changing.
    const std::size_t frames = static_cast<std::size_t>(sampleRate);
    std::vector<std::vector<float>> source(channels, std::vector<float>(frames));
    std::uint32_t seed = 12345;
    for (auto& channel : source)
        for (float& v : channel) {
            seed = seed * 1664525u + 1013904223u;
            v = static_cast<float>(seed) / 2147483648.0f - 1.0f;
        }
    std::vector<std::vector<float>> work(channels, std::vector<float>(kBlock));
    std::vector<float*> pointers(channels);
    for (std::uint32_t c = 0; c < channels; ++c) pointers[c] = work[c].data();
    std::size_t position = 0;
    // The copy of fresh input is timed too; it costs little beside processing.
    for (auto _ : state) {
        for (std::uint32_t c = 0; c < channels; ++c)
            std::copy_n(source[c].begin() + static_cast<std::ptrdiff_t>(position), kBlock, work[c].begin());
        position = (position + kBlock) % (frames - kBlock);
        audio->Process(pointers.data(), kBlock);
        benchmark::ClobberMemory();
    }
    ReportRealtime(state, kBlock, sampleRate);
}

}  // namespace zenbench
