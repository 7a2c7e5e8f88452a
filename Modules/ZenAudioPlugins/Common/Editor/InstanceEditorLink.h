// The link of an editor that runs beside its instance in one process: every
// call goes straight to the instance's lock-free reads and setters. Over a
// control plug-in (no audio) it has no meters or channels, the default rate
// and no latency, and bypass does nothing. Before the audio instance is
// prepared it reports no channels and the default rate.
#pragma once

#include "zen/EditorLink.h"
#include "zen/PluginParameters.h"

class ZenAudioPluginImpl;

class InstanceEditorLink : public zen::EditorLink {
public:
    static constexpr float kDefaultSampleRate = 48000.0f;

    explicit InstanceEditorLink(ZenAudioPluginImpl& audio);
    explicit InstanceEditorLink(zen::PluginParameters& control);

    std::uint32_t GetParameterCount() const override;
    bool GetParameterInfo(std::uint32_t index, zen::ParameterInfo& info) const override;
    float GetParameter(std::uint32_t index) const override;
    bool SetParameter(std::uint32_t index, float value) override;

    std::uint32_t GetMeterCount() const override;
    bool GetMeterInfo(std::uint32_t index, zen::MeterInfo& info) const override;
    float GetMeter(std::uint32_t index) const override;
    bool ReadMeterArray(std::uint32_t index, float* values, std::uint32_t count) const override;
    zen::MeterRingRead ReadMeterRing(std::uint32_t index, std::uint64_t& cursor, float* records,
                                     std::uint32_t maxRecords) const override;

    float GetSampleRate() const override;
    std::uint32_t GetInputChannelCount() const override;
    std::uint32_t GetOutputChannelCount() const override;
    std::uint32_t GetLatency() const override;
    bool IsBypassed() const override;
    void SetBypass(bool bypassed) override;
    bool HasAudio() const override { return m_audio != nullptr; }

    std::vector<std::string> GetPresetNames() const override;
    bool LoadPreset(const std::string& name) override;

private:
    zen::PluginParameters& m_parameters;
    ZenAudioPluginImpl* m_audio = nullptr;  // null over a control plug-in
};
