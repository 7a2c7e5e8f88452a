#include "PluginChain.h"

#include "MeterJson.h"
#include "NameSuggestions.h"
#include "ParameterValue.h"
#include "ZenfxError.h"

namespace zenfx {

namespace {

// "1 or 2", "1 to 32": the channel counts a plug-in accepts (in = out).
std::string AcceptedCounts(AudioPlugin& audio, const zen::PluginDescriptor& descriptor) {
    std::vector<std::uint32_t> counts;
    const std::uint32_t limit = std::max(descriptor.inputChannelLimit, descriptor.outputChannelLimit);
    for (std::uint32_t n = 1; n <= limit; ++n) {
        const std::uint32_t in = descriptor.inputChannelLimit == 0 ? 0 : n;
        if (audio.ConfigureChannels(in, n)) counts.push_back(n);
    }
    if (counts.empty()) return "no layout zenfx can offer";
    if (counts.size() == 1) return std::to_string(counts[0]);
    if (counts.size() == 2) return std::to_string(counts[0]) + " or " + std::to_string(counts[1]);
    return std::to_string(counts.front()) + " to " + std::to_string(counts.back());
}

}  // namespace

PluginChain::Stage& PluginChain::Add(PluginLibrary& library, const std::string& nameOrKey) {
    Stage stage;
    stage.plugin = library.FindAudioPlugin(nameOrKey);
    stage.instance = library.Create(stage.plugin);
    stage.audio = &AudioOf(*stage.instance);
    m_stages.push_back(std::move(stage));
    return m_stages.back();
}

void PluginChain::ConfigureChannels(std::uint32_t channels) {
    for (Stage& stage : m_stages) {
        const zen::PluginDescriptor& descriptor = *stage.instance->GetDescriptor();
        const std::uint32_t inputs = descriptor.inputChannelLimit == 0 ? 0 : channels;
        if (stage.audio->ConfigureChannels(inputs, channels)) continue;
        throw ZenfxError("'" + stage.plugin.entry.name + "' does not accept " + std::to_string(channels) +
                         " channel" + (channels == 1 ? "" : "s") + " (it takes " +
                         AcceptedCounts(*stage.audio, descriptor) + ")");
    }
}

void PluginChain::ApplySetting(Stage& stage, const std::string& assignment) {
    const std::size_t equals = assignment.find('=');
    if (equals == std::string::npos || equals == 0)
        throw ZenfxError("--set '" + assignment + "' is not PARAM=VALUE", kExitUsage);
    const std::string& pluginName = stage.plugin.entry.name;
    const std::uint32_t index = FindParameter(*stage.audio, pluginName, assignment.substr(0, equals));
    zen::ParameterInfo info;
    stage.audio->GetParameterInfo(index, info);
    const float value = ParseParameterValue(info, pluginName, assignment.substr(equals + 1));
    if (!stage.audio->SetParameter(index, value))
        throw ZenfxError("'" + pluginName + "' refused " + assignment);
}

void PluginChain::ApplyPreset(Stage& stage, const std::string& preset) {
    const std::vector<std::string> names = stage.audio->GetPresetNames();
    for (const std::string& name : names) {
        if (!EqualsIgnoreCase(name, preset)) continue;
        if (!stage.audio->LoadPreset(name))
            throw ZenfxError("preset '" + name + "' of '" + stage.plugin.entry.name + "' could not be loaded");
        return;
    }
    throw ZenfxError("'" + stage.plugin.entry.name + "' has no preset '" + preset + "'" + DidYouMean(preset, names));
}

void PluginChain::Prepare(int sampleRate, std::uint32_t maxBlock) {
    for (Stage& stage : m_stages)
        if (!stage.audio->Prepare(static_cast<float>(sampleRate), maxBlock))
            throw ZenfxError("'" + stage.plugin.entry.name + "' cannot run at " + std::to_string(sampleRate) +
                             " Hz in blocks of " + std::to_string(maxBlock));
}

std::uint64_t PluginChain::Latency() const {
    std::uint64_t total = 0;
    for (const Stage& stage : m_stages) total += stage.audio->GetLatency();
    return total;
}

void PluginChain::Process(float* const* channels, std::uint64_t frames) {
    for (Stage& stage : m_stages)
        if (!stage.audio->Process(channels, frames))
            throw ZenfxError("'" + stage.plugin.entry.name + "' failed to process a block");
}

nlohmann::json PluginChain::MetersJson() const {
    nlohmann::json plugins = nlohmann::json::array();
    for (const Stage& stage : m_stages) {
        nlohmann::json meters = nlohmann::json::array();
        for (std::uint32_t i = 0; i < stage.audio->GetMeterCount(); ++i) meters.push_back(ReadMeter(*stage.audio, i));
        plugins.push_back({{"name", stage.plugin.entry.name}, {"key", stage.plugin.key}, {"meters", meters}});
    }
    return {{"plugins", plugins}};
}

std::string PluginChain::Names() const {
    std::string names;
    for (const Stage& stage : m_stages) names += (names.empty() ? "" : " -> ") + stage.plugin.entry.name;
    return names;
}

}  // namespace zenfx
