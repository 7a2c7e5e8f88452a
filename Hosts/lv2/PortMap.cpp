#include "PortMap.h"

#include <cctype>

namespace zenlv2 {

namespace {

// Loudspeaker names in the library's WAV order.
constexpr const char* kFivePointOne[] = {"L", "R", "C", "LFE", "Ls", "Rs"};
constexpr const char* kSevenPointOne[] = {"L", "R", "C", "LFE", "Lb", "Rb", "Ls", "Rs"};

// "In", "Out" for mono; "In L", "In R" for stereo; "In LFE", "In Ls" for
// 5.1 and 7.1; "In 3" for other widths. Symbols in lower case: "in_lfe".
std::string ChannelSuffix(std::uint32_t channel, std::uint32_t count, bool symbol) {
    if (count == 1) return "";
    std::string name;
    if (count == 2) name = channel == 0 ? "L" : "R";
    else if (count == 6 && channel < 6) name = kFivePointOne[channel];
    else if (count == 8 && channel < 8) name = kSevenPointOne[channel];
    else name = std::to_string(channel + 1);
    if (!symbol) return " " + name;
    for (char& c : name) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return "_" + name;
}

}  // namespace

std::string PortMap::MakeSymbol(const std::string& text) {
    const std::size_t colons = text.rfind("::");
    const std::string name = colons == std::string::npos ? text : text.substr(colons + 2);
    std::string symbol;
    for (char c : name) {
        const auto u = static_cast<unsigned char>(c);
        if (std::isalnum(u)) symbol += static_cast<char>(std::tolower(u));
        else if (!symbol.empty() && symbol.back() != '_') symbol += '_';
    }
    while (!symbol.empty() && symbol.back() == '_') symbol.pop_back();
    if (symbol.empty() || std::isdigit(static_cast<unsigned char>(symbol[0]))) symbol = "p_" + symbol;
    return symbol;
}

PortMap::PortMap(const AudioPlugin& audio, std::uint32_t inputs, std::uint32_t outputs)
    : m_inputs(inputs), m_outputs(outputs) {
    for (std::uint32_t c = 0; c < inputs; ++c)
        Add({PortType::AudioInput, c, "in" + ChannelSuffix(c, inputs, true), "In" + ChannelSuffix(c, inputs, false),
             {}, {}});
    for (std::uint32_t c = 0; c < outputs; ++c)
        Add({PortType::AudioOutput, c, "out" + ChannelSuffix(c, outputs, true),
             "Out" + ChannelSuffix(c, outputs, false), {}, {}});
    Add({PortType::Enabled, 0, "enabled", "Enabled", {}, {}});
    Add({PortType::Latency, 0, "latency", "Latency", {}, {}});

    m_parameterCount = audio.GetParameterCount();
    for (std::uint32_t p = 0; p < m_parameterCount; ++p) {
        Port port{PortType::Parameter, p, {}, {}, {}, {}};
        audio.GetParameterInfo(p, port.parameter);
        port.symbol = MakeSymbol(port.parameter.identifier);
        port.name = port.parameter.label;
        Add(std::move(port));
    }
    for (std::uint32_t m = 0; m < audio.GetMeterCount(); ++m) {
        Port port{PortType::Meter, m, {}, {}, {}, {}};
        audio.GetMeterInfo(m, port.meter);
        if (port.meter.kind != zen::MeterKind::Level && port.meter.kind != zen::MeterKind::Value) continue;
        port.symbol = MakeSymbol(port.meter.identifier);
        port.name = port.meter.name;
        Add(std::move(port));
        ++m_meterCount;
    }
}

void PortMap::Add(Port port) {
    // Symbols must be unique within a plug-in; a clash gets a number.
    std::string symbol = port.symbol;
    for (int n = 2;; ++n) {
        bool taken = false;
        for (const Port& other : m_ports) taken = taken || other.symbol == symbol;
        if (!taken) break;
        symbol = port.symbol + "_" + std::to_string(n);
    }
    port.symbol = symbol;
    m_ports.push_back(std::move(port));
}

}  // namespace zenlv2
