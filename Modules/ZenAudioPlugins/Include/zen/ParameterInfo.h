// Descriptions of parameters and meters, as a host shows them.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace zen {

enum class ParameterKind : std::uint32_t {
    Continuous = 0,
    Switch = 1,  // values 0 and 1
    List = 2,    // values minimum, minimum + step, ... maximum, one caption each
};

// How a value maps to a control's normalised 0..1 position.
enum class ParameterTaper : std::uint32_t {
    Linear = 0,
    Logarithmic = 1,  // frequencies
    List = 2,         // discrete values
};

struct ParameterInfo {
    std::string identifier;  // class name, "::" and an upper-case name: "ZenSoftClipper::THRESHOLD"
    std::string label;       // display name: "Threshold"
    ParameterKind kind = ParameterKind::Continuous;
    ParameterTaper taper = ParameterTaper::Linear;
    float minimum = 0.0f;
    float maximum = 1.0f;
    float defaultValue = 0.0f;
    float step = 0.0f;        // display resolution; 0 = none
    std::string unit;         // "dB", "Hz", "ms", "%", "dBTP", or empty
    std::vector<std::string> choices;  // captions of a list parameter, in value order
};

struct MeterInfo {
    std::string name;  // "Input Peak 1", "Gain Reduction"
    std::string unit;  // "dB", "dBTP", or empty
    float minimum = 0.0f;  // display range; readings may leave it
    float maximum = 0.0f;
};

}  // namespace zen
