// The LV2 ports of one plug-in in one channel layout, in index order:
// audio inputs, audio outputs, "enabled" (the host's bypass), "latency",
// one control input per parameter, one control output per level or value
// meter (array and ring meters have no port: a control port carries one
// number). Fixed ports come first and meters last, so a parameter added to a
// table moves only the meters' indices. Symbols come from the parameters' and
// meters' identifiers.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "zen/Zen.h"

namespace zenlv2 {

enum class PortType { AudioInput, AudioOutput, Enabled, Latency, Parameter, Meter };

struct Port {
    PortType type = PortType::AudioInput;
    std::uint32_t source = 0;  // channel, parameter index or meter index
    std::string symbol;
    std::string name;
    zen::ParameterInfo parameter;  // PortType::Parameter
    zen::MeterInfo meter;          // PortType::Meter
};

class PortMap {
public:
    // `audio` must already take `inputs` and `outputs`.
    PortMap(const AudioPlugin& audio, std::uint32_t inputs, std::uint32_t outputs);

    const std::vector<Port>& Ports() const { return m_ports; }
    std::uint32_t Inputs() const { return m_inputs; }
    std::uint32_t Outputs() const { return m_outputs; }
    std::uint32_t ParameterCount() const { return m_parameterCount; }
    std::uint32_t MeterCount() const { return m_meterCount; }  // meter ports

    // "threshold" from "ZenSoftClipper::THRESHOLD", "input_peak_1" from
    // "ZenSoftClipper::INPUT_PEAK_1": lower case, [a-z0-9_], never starting
    // with a digit.
    static std::string MakeSymbol(const std::string& text);

private:
    void Add(Port port);

    std::vector<Port> m_ports;
    std::uint32_t m_inputs;
    std::uint32_t m_outputs;
    std::uint32_t m_parameterCount = 0;
    std::uint32_t m_meterCount = 0;
};

}  // namespace zenlv2
