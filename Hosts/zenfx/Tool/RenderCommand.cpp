// zenfx render: a plug-in without audio input (a sampler) played by a
// trigger list. Blocks are split at every trigger so that each lands on the
// sample it names.
#include <nlohmann/json.hpp>

#include <algorithm>
#include <iostream>
#include <vector>

#include "AudioFile.h"
#include "Commands.h"
#include "ParameterValue.h"
#include "StageSettings.h"
#include "TriggerList.h"
#include "ZenfxError.h"

namespace zenfx {

namespace {

// Longest render: an hour of audio.
constexpr std::uint64_t kMaxSeconds = 3600;

// Sets text fields of the state (a sample folder, ...) and reports what the
// plug-in says it skipped while loading them.
void ApplyStateFields(AudioPlugin& audio, const std::string& pluginName, const std::vector<std::string>& assignments) {
    if (assignments.empty()) return;
    nlohmann::json state = nlohmann::json::parse(audio.SaveState(), nullptr, false);
    if (!state.is_object()) throw ZenfxError("'" + pluginName + "' gave a state that is not JSON");
    for (const std::string& assignment : assignments) {
        const std::size_t equals = assignment.find('=');
        if (equals == std::string::npos || equals == 0)
            throw ZenfxError("--state-set '" + assignment + "' is not KEY=VALUE", kExitUsage);
        const std::string key = assignment.substr(0, equals);
        if (key == "parameters" || key == "class" || key == "format")
            throw ZenfxError("--state-set cannot replace '" + key + "'; use --set for parameters", kExitUsage);
        state[key] = assignment.substr(equals + 1);
    }
    if (!audio.LoadState(state.dump())) throw ZenfxError("'" + pluginName + "' refused the state fields");
    const nlohmann::json loaded = nlohmann::json::parse(audio.SaveState(), nullptr, false);
    if (loaded.is_object() && loaded.contains("skipped") && loaded["skipped"].is_array())
        for (const auto& entry : loaded["skipped"])
            if (entry.is_string()) std::cerr << "zenfx: " << pluginName << " skipped " << entry.get<std::string>() << "\n";
}

}  // namespace

int RunRender(PluginLibrary& library, const RenderOptions& options) {
    if (options.block < 1 || options.block > (1u << 20))
        throw ZenfxError("--block must be between 1 and 1048576 frames", kExitUsage);
    if (options.channels < 1 || options.channels > 32)
        throw ZenfxError("--channels must be between 1 and 32", kExitUsage);
    std::vector<Trigger> triggers = ReadTriggerList(options.triggers, options.sampleRate);
    const int format = ChooseOutputFormat(options.output, SF_FORMAT_WAV | SF_FORMAT_FLOAT, options.format);

    const PluginEntry plugin = library.FindAudioPlugin(options.plugin);
    const std::string& name = plugin.entry.name;
    std::unique_ptr<zen::PluginInstance> instance = library.Create(plugin);
    AudioPlugin& audio = AudioOf(*instance);
    if (!audio.ConfigureChannels(0, options.channels))
        throw ZenfxError("'" + name + "' does not play " + std::to_string(options.channels) +
                         " channels without audio input; render is for plug-ins without input (samplers)");
    const std::uint32_t pad = FindParameter(audio, name, "Pad");
    const std::uint32_t trigger = FindParameter(audio, name, "Trigger");
    StageSettings(audio, name, [](const std::string& message) {
        std::cerr << "zenfx: warning: " << message << "\n";
    }).Apply(options.actions);
    ApplyStateFields(audio, name, options.stateFields);
    if (!audio.SetParameter(trigger, 0.0f)) throw ZenfxError("'" + name + "' refused its trigger");
    if (!audio.Prepare(static_cast<float>(options.sampleRate), options.block))
        throw ZenfxError("'" + name + "' cannot run at " + std::to_string(options.sampleRate) + " Hz in blocks of " +
                         std::to_string(options.block));

    if (const std::size_t moved = SpaceTriggers(triggers))
        std::cerr << "zenfx: " << moved << " trigger(s) less than " << kTriggerSpacing
                  << " samples after another were moved later by that much\n";
    const std::uint64_t rate = static_cast<std::uint64_t>(options.sampleRate);
    std::uint64_t total = 0;
    if (options.seconds > 0.0) total = static_cast<std::uint64_t>(options.seconds * options.sampleRate + 0.5);
    else total = (triggers.empty() ? 0 : triggers.back().frame + 1) + audio.GetTailLength();
    if (total > kMaxSeconds * rate) throw ZenfxError("the render would be longer than an hour; give --length");

    const std::size_t channels = options.channels;
    std::vector<float> planar(channels * options.block);
    std::vector<float*> pointers(channels);
    for (std::size_t c = 0; c < channels; ++c) pointers[c] = planar.data() + c * options.block;
    std::vector<float> interleaved(channels * options.block);
    AudioFileWriter writer(options.output, options.sampleRate, static_cast<int>(channels), format);

    // Processes [done, end) and writes it.
    std::uint64_t done = 0;
    auto advance = [&](std::uint64_t end) {
        end = std::min(end, total);
        while (done < end) {
            const auto frames = static_cast<std::size_t>(std::min<std::uint64_t>(end - done, options.block));
            std::fill(planar.begin(), planar.end(), 0.0f);
            if (!audio.Process(pointers.data(), frames)) throw ZenfxError("'" + name + "' failed to process");
            for (std::size_t i = 0; i < frames; ++i)
                for (std::size_t c = 0; c < channels; ++c) interleaved[i * channels + c] = pointers[c][i];
            writer.Write(interleaved.data(), static_cast<std::int64_t>(frames));
            done += frames;
        }
    };
    std::size_t played = 0;
    for (const Trigger& t : triggers) {
        if (t.frame >= total) break;
        advance(t.frame);
        // Handed over at the next block's first sample; a one-frame block lets it fall again.
        audio.SetParameter(pad, static_cast<float>(t.pad));
        audio.SetParameter(trigger, 1.0f);
        advance(t.frame + 1);
        audio.SetParameter(trigger, 0.0f);
        ++played;
    }
    advance(total);
    writer.Commit();
    std::cout << "zenfx: rendered " << played << " trigger(s) of '" << name << "' to " << options.output << " ("
              << DescribeFormat(format) << ", " << channels << " ch, " << options.sampleRate << " Hz, "
              << static_cast<double>(total) / options.sampleRate << " s)\n";
    return 0;
}

}  // namespace zenfx
