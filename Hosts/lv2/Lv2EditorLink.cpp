#include "Lv2EditorLink.h"

#include <cmath>

namespace zenlv2 {

Lv2EditorLink::Lv2EditorLink(AudioPlugin& audio, const PortMap& ports, LV2UI_Write_Function write,
                             LV2UI_Controller controller, float sampleRate)
    : m_audio(audio),
      m_write(write),
      m_controller(controller),
      m_sampleRate(sampleRate),
      m_inputs(ports.Inputs()),
      m_outputs(ports.Outputs()),
      m_parameterPorts(audio.GetParameterCount(), kNoPort),
      m_meterPorts(audio.GetMeterCount(), kNoPort),
      m_meters(audio.GetMeterCount(), 0.0f) {
    for (std::uint32_t m = 0; m < m_meters.size(); ++m) m_meters[m] = audio.GetMeter(m);  // at rest
    for (std::uint32_t index = 0; index < ports.Ports().size(); ++index) {
        const Port& port = ports.Ports()[index];
        m_portTypes.push_back(port.type);
        m_portSources.push_back(port.source);
        if (port.type == PortType::Parameter && port.source < m_parameterPorts.size())
            m_parameterPorts[port.source] = index;
        else if (port.type == PortType::Meter && port.source < m_meterPorts.size())
            m_meterPorts[port.source] = index;
        else if (port.type == PortType::Enabled)
            m_enabledPort = index;
    }
}

void Lv2EditorLink::PortEvent(std::uint32_t port, float value) {
    if (port >= m_portTypes.size() || !std::isfinite(value)) return;
    const std::uint32_t source = m_portSources[port];
    switch (m_portTypes[port]) {
        case PortType::Parameter: m_audio.SetParameter(source, value); break;
        case PortType::Meter:
            if (source < m_meters.size()) m_meters[source] = value;
            break;
        case PortType::Enabled: m_enabled = value > 0.5f; break;
        case PortType::Latency: m_latency = value > 0.0f ? static_cast<std::uint32_t>(std::lround(value)) : 0; break;
        case PortType::AudioInput:
        case PortType::AudioOutput: break;
    }
}

void Lv2EditorLink::Write(std::uint32_t port, float value) const {
    if (m_write != nullptr && port != kNoPort) m_write(m_controller, port, sizeof(float), 0, &value);
}

std::uint32_t Lv2EditorLink::GetParameterCount() const { return m_audio.GetParameterCount(); }

bool Lv2EditorLink::GetParameterInfo(std::uint32_t index, zen::ParameterInfo& info) const {
    return m_audio.GetParameterInfo(index, info);
}

float Lv2EditorLink::GetParameter(std::uint32_t index) const { return m_audio.GetParameter(index); }

bool Lv2EditorLink::SetParameter(std::uint32_t index, float value) {
    if (index >= m_parameterPorts.size() || !m_audio.SetParameter(index, value)) return false;
    Write(m_parameterPorts[index], m_audio.GetParameter(index));  // clamped as the plug-in holds it
    return true;
}

std::uint32_t Lv2EditorLink::GetMeterCount() const { return static_cast<std::uint32_t>(m_meters.size()); }

bool Lv2EditorLink::GetMeterInfo(std::uint32_t index, zen::MeterInfo& info) const {
    return m_audio.GetMeterInfo(index, info);
}

float Lv2EditorLink::GetMeter(std::uint32_t index) const { return index < m_meters.size() ? m_meters[index] : 0.0f; }

void Lv2EditorLink::SetBypass(bool bypassed) {
    m_enabled = !bypassed;
    Write(m_enabledPort, bypassed ? 0.0f : 1.0f);
}

std::vector<std::string> Lv2EditorLink::GetPresetNames() const { return m_audio.GetPresetNames(); }

bool Lv2EditorLink::LoadPreset(const std::string& name) {
    if (!m_audio.LoadPreset(name)) return false;
    // The plug-in in the host hears of the preset only through its ports.
    for (std::uint32_t p = 0; p < m_parameterPorts.size(); ++p) Write(m_parameterPorts[p], m_audio.GetParameter(p));
    return true;
}

}  // namespace zenlv2
