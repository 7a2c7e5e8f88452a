#include "ZenFaultyGain.h"

#include <map>
#include <mutex>
#include <string>

#include "Common/Decibels.h"

ZenFaultyGain::ZenFaultyGain(const char* className) {
    InitParameters(Definitions(className));
    AttachSmoothedValue(m_gain);
}

const zen::ParameterTableDefinition& ZenFaultyGain::Definitions(const char* className) {
    static std::mutex mutex;
    static std::map<std::string, zen::ParameterTableDefinition> tables;
    std::lock_guard<std::mutex> lock(mutex);
    auto table = tables.find(className);
    if (table == tables.end()) {
        zen::ParameterTableDefinition rows = zen::MakeParameterTable(
            className, {zen::ContinuousParameter("GAIN", "Gain", -24.0f, 12.0f, 0.0f, 0.1f, "dB"),
                        zen::ContinuousParameter("SMOOTHING", "Smoothing", 0.0f, 0.99f, 0.0f, 0.01f)});
        table = tables.emplace(className, std::move(rows)).first;
    }
    return table->second;
}

bool ZenFaultyGain::OnParameterChanged(std::uint32_t index, float value) {
    if (!ZenAudioPluginImpl::OnParameterChanged(index, value)) return false;
    if (index == kGain) m_gain.SetTarget(zen::DbToGain(value));
    return true;
}

void ZenFaultyGain::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        auto gain = m_gain.Track(c);
        for (std::uint32_t i = 0; i < frames; ++i) channels[c][i] *= static_cast<float>(gain.Next());
    }
}
