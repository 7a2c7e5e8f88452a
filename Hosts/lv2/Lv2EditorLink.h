// The editor's link in an LV2 UI: the plug-in runs in the host, out of the
// UI's reach, and the two meet only at control ports. The UI keeps an
// unprepared instance of the same key for the parameters' descriptions,
// values and presets; a change from the editor goes to the parameter's port
// (float protocol), values from the host (port events) come back into the
// instance, and meters are the last values of their output ports. Arrays
// and rings have no port: those reads answer false.
#pragma once

#include <lv2/ui/ui.h>

#include <cstdint>
#include <vector>

#include "PortMap.h"
#include "zen/EditorLink.h"
#include "zen/Zen.h"

namespace zenlv2 {

class Lv2EditorLink final : public zen::EditorLink {
public:
    // `audio` (kept) is configured in the layout of `ports`.
    Lv2EditorLink(AudioPlugin& audio, const PortMap& ports, LV2UI_Write_Function write,
                  LV2UI_Controller controller, float sampleRate);

    // A control port's value from the host.
    void PortEvent(std::uint32_t port, float value);

    std::uint32_t GetParameterCount() const override;
    bool GetParameterInfo(std::uint32_t index, zen::ParameterInfo& info) const override;
    float GetParameter(std::uint32_t index) const override;
    bool SetParameter(std::uint32_t index, float value) override;

    std::uint32_t GetMeterCount() const override;
    bool GetMeterInfo(std::uint32_t index, zen::MeterInfo& info) const override;
    float GetMeter(std::uint32_t index) const override;

    float GetSampleRate() const override { return m_sampleRate; }
    std::uint32_t GetInputChannelCount() const override { return m_inputs; }
    std::uint32_t GetOutputChannelCount() const override { return m_outputs; }
    std::uint32_t GetLatency() const override { return m_latency; }
    bool IsBypassed() const override { return !m_enabled; }
    void SetBypass(bool bypassed) override;

    std::vector<std::string> GetPresetNames() const override;
    bool LoadPreset(const std::string& name) override;

private:
    static constexpr std::uint32_t kNoPort = UINT32_MAX;

    void Write(std::uint32_t port, float value) const;

    AudioPlugin& m_audio;
    LV2UI_Write_Function m_write;
    LV2UI_Controller m_controller;
    float m_sampleRate;
    std::uint32_t m_inputs;
    std::uint32_t m_outputs;
    std::vector<std::uint32_t> m_parameterPorts;  // by parameter index
    std::vector<std::uint32_t> m_meterPorts;      // by meter index; kNoPort for arrays and rings
    std::vector<float> m_meters;                  // by meter index
    std::vector<PortType> m_portTypes;            // by port index
    std::vector<std::uint32_t> m_portSources;     // by port index
    std::uint32_t m_enabledPort = kNoPort;
    bool m_enabled = true;
    std::uint32_t m_latency = 0;
};

}  // namespace zenlv2
