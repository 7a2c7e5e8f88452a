// Base of the faulty test plug-ins: a smoothed "Gain" in dB, up to two
// channels. Each subclass adds one deliberate fault, so that the validator's
// tests can show the matching check failing. Never registered itself, and
// only ever linked into libZenFaultyPlugins.so, a test library of its own.
#pragma once

#include "Common/SmoothedValueGroup.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenFaultyGain : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    enum Parameter : std::uint32_t { kGain, kSmoothing };

    // The table carries the subclass's name, as a plug-in's identifiers do.
    static const zen::ParameterTableDefinition& Definitions(const char* className);

protected:
    explicit ZenFaultyGain(const char* className);

    bool OnParameterChanged(std::uint32_t index, float value) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;

    zen::SmoothedValueGroup m_gain{kMaxChannels, 1.0f};
};

// Descriptor of a faulty plug-in: two channels, code "Zt" and two letters.
// Constant, so that it is ready before any registration runs.
constexpr zen::PluginDescriptor FaultyDescriptor(const char* name, const char* className, char c, char d) {
    return {name, 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 't', c, d), 2, 2, className, 0, 0, -1, nullptr};
}
