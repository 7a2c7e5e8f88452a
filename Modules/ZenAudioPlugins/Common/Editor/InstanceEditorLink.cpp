#include "InstanceEditorLink.h"

#include "Common/ZenAudioPluginImpl.h"

InstanceEditorLink::InstanceEditorLink(ZenAudioPluginImpl& audio) : m_parameters(audio), m_audio(&audio) {}

InstanceEditorLink::InstanceEditorLink(zen::PluginParameters& control) : m_parameters(control) {}

std::uint32_t InstanceEditorLink::GetParameterCount() const { return m_parameters.GetParameterCount(); }

bool InstanceEditorLink::GetParameterInfo(std::uint32_t index, zen::ParameterInfo& info) const {
    return m_parameters.GetParameterInfo(index, info);
}

float InstanceEditorLink::GetParameter(std::uint32_t index) const { return m_parameters.GetParameter(index); }

bool InstanceEditorLink::SetParameter(std::uint32_t index, float value) {
    return m_parameters.SetParameter(index, value);
}

std::uint32_t InstanceEditorLink::GetMeterCount() const { return m_audio ? m_audio->GetMeterCount() : 0; }

bool InstanceEditorLink::GetMeterInfo(std::uint32_t index, zen::MeterInfo& info) const {
    return m_audio && m_audio->GetMeterInfo(index, info);
}

float InstanceEditorLink::GetMeter(std::uint32_t index) const { return m_audio ? m_audio->GetMeter(index) : 0.0f; }

bool InstanceEditorLink::ReadMeterArray(std::uint32_t index, float* values, std::uint32_t count) const {
    return m_audio && m_audio->ReadMeterArray(index, values, count);
}

zen::MeterRingRead InstanceEditorLink::ReadMeterRing(std::uint32_t index, std::uint64_t& cursor, float* records,
                                                     std::uint32_t maxRecords) const {
    return m_audio ? m_audio->ReadMeterRing(index, cursor, records, maxRecords) : zen::MeterRingRead{};
}

float InstanceEditorLink::GetSampleRate() const {
    return m_audio && m_audio->IsPrepared() ? static_cast<float>(m_audio->GetSampleRate()) : kDefaultSampleRate;
}

std::uint32_t InstanceEditorLink::GetInputChannelCount() const {
    return m_audio && m_audio->IsPrepared() ? m_audio->GetInputChannelCount() : 0;
}

std::uint32_t InstanceEditorLink::GetOutputChannelCount() const {
    return m_audio && m_audio->IsPrepared() ? m_audio->GetOutputChannelCount() : 0;
}

std::uint32_t InstanceEditorLink::GetLatency() const { return m_audio ? m_audio->GetLatency() : 0; }

bool InstanceEditorLink::IsBypassed() const { return m_audio && m_audio->IsBypassed(); }

void InstanceEditorLink::SetBypass(bool bypassed) {
    if (m_audio) m_audio->SetBypass(bypassed);
}

std::vector<std::string> InstanceEditorLink::GetPresetNames() const { return m_parameters.GetPresetNames(); }

bool InstanceEditorLink::LoadPreset(const std::string& name) { return m_parameters.LoadPreset(name); }
