#include "Support/PluginHarness.h"

#include <gtest/gtest.h>

#include <algorithm>

namespace zentest {

PluginHarness::PluginHarness(const std::string& name) {
    zen::PluginInterface* library = GetZenPluginInterface();
    for (const auto& [key, entry] : library->GetPluginList(zen::kAudioPluginKind)) {
        if (entry.name != name) continue;
        m_instance.reset(library->CreatePlugin(zen::kAudioPluginKind, key));
        break;
    }
    if (!m_instance) throw std::runtime_error("no audio plug-in named " + name);
    m_audio = zen::InterfaceCast<AudioPlugin>(m_instance.get());
    if (m_audio == nullptr) throw std::runtime_error(name + " has no audio interface");
}

void PluginHarness::Prepare(std::uint32_t channels, float sampleRate, std::uint32_t maxBlock) {
    const std::uint32_t inputs = m_instance->GetDescriptor()->inputChannelLimit == 0 ? 0 : channels;
    if (!m_audio->ConfigureChannels(inputs, channels)) throw std::runtime_error("layout refused");
    if (!m_audio->Prepare(sampleRate, maxBlock)) throw std::runtime_error("prepare refused");
}

void PluginHarness::Set(const std::string& labelOrIdentifier, float value) {
    auto* controls = zen::InterfaceCast<ZenControlValueHost>(m_instance.get());
    const std::int32_t index = controls->FindParameter(labelOrIdentifier.c_str());
    if (index < 0) throw std::runtime_error("no parameter " + labelOrIdentifier);
    if (!m_audio->SetParameter(static_cast<std::uint32_t>(index), value))
        throw std::runtime_error("parameter refused: " + labelOrIdentifier);
}

float PluginHarness::Get(const std::string& labelOrIdentifier) {
    auto* controls = zen::InterfaceCast<ZenControlValueHost>(m_instance.get());
    const std::int32_t index = controls->FindParameter(labelOrIdentifier.c_str());
    if (index < 0) throw std::runtime_error("no parameter " + labelOrIdentifier);
    return m_audio->GetParameter(static_cast<std::uint32_t>(index));
}

void PluginHarness::Process(Channels& channels, std::size_t block) {
    const std::size_t frames = channels.empty() ? 0 : channels[0].size();
    if (block == 0) block = std::max<std::size_t>(frames, 1);
    std::vector<float*> pointers(channels.size());
    for (std::size_t done = 0; done < frames; done += block) {
        const std::size_t n = std::min(block, frames - done);
        for (std::size_t c = 0; c < channels.size(); ++c) pointers[c] = channels[c].data() + done;
        if (!m_audio->Process(pointers.data(), n)) throw std::runtime_error("process refused");
    }
}

Channels PluginHarness::Run(const std::vector<float>& input, std::uint32_t channels, std::size_t block) {
    Channels buffers(channels, input);
    Process(buffers, block);
    return buffers;
}

void PluginHarness::ProcessSwitched(Channels& channels, std::size_t at,
                                    const std::vector<std::pair<std::string, float>>& changes, std::size_t block) {
    Channels head(channels.size()), tail(channels.size());
    for (std::size_t c = 0; c < channels.size(); ++c) {
        head[c].assign(channels[c].begin(), channels[c].begin() + static_cast<std::ptrdiff_t>(at));
        tail[c].assign(channels[c].begin() + static_cast<std::ptrdiff_t>(at), channels[c].end());
    }
    Process(head, block);
    for (const auto& [name, value] : changes) Set(name, value);
    Process(tail, block);
    for (std::size_t c = 0; c < channels.size(); ++c) {
        std::copy(head[c].begin(), head[c].end(), channels[c].begin());
        std::copy(tail[c].begin(), tail[c].end(), channels[c].begin() + static_cast<std::ptrdiff_t>(at));
    }
}

float PluginHarness::Meter(const std::string& name) {
    for (std::uint32_t i = 0; i < m_audio->GetMeterCount(); ++i) {
        zen::MeterInfo info;
        m_audio->GetMeterInfo(i, info);
        if (info.name == name) return m_audio->GetMeter(i);
    }
    throw std::runtime_error("no meter " + name);
}

std::vector<float> PluginHarness::MeterArray(const std::string& name) {
    for (std::uint32_t i = 0; i < m_audio->GetMeterCount(); ++i) {
        zen::MeterInfo info;
        m_audio->GetMeterInfo(i, info);
        if (info.name != name) continue;
        std::vector<float> values(info.size);
        if (!m_audio->ReadMeterArray(i, values.data(), info.size)) throw std::runtime_error("unreadable meter " + name);
        return values;
    }
    throw std::runtime_error("no meter " + name);
}

PluginHarness Prepared(const std::string& name, const std::vector<std::pair<std::string, float>>& settings,
                       std::uint32_t channels, float sampleRate, std::uint32_t maxBlock) {
    PluginHarness plugin(name);
    for (const auto& [parameter, value] : settings) plugin.Set(parameter, value);
    plugin.Prepare(channels, sampleRate, maxBlock);
    return plugin;
}

std::vector<std::string> RegisteredAudioKeys() {
    std::vector<std::string> keys;
    for (const auto& [key, entry] : GetZenPluginInterface()->GetPluginList(zen::kAudioPluginKind)) keys.push_back(key);
    return keys;
}

}  // namespace zentest
