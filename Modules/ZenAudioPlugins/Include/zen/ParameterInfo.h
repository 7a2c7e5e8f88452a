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

// How the host action "SetIntParameter" reads its integer, which carries a
// value in tenths: integer / 10 is
//   OwnValue: the value itself, in the parameter's unit (a switch 1, an
//             amount 0.65, a time 1000 ms);
//   PerMille: a place along the control, 0..1000 for its normalised 0..1
//             position on the parameter's taper (linear, logarithmic, or the
//             index of a list or switch): 500 is the middle of -18..18 dB,
//             i.e. 0 dB, and 1000 turns a switch on.
// Values outside the range are clamped to it. A parameter declares its scale
// in its definition; the default is OwnValue.
enum class HostScale : std::uint32_t {
    OwnValue = 0,
    PerMille = 1,
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
    HostScale hostScale = HostScale::OwnValue;
};

// What a meter publishes and how a host reads it.
enum class MeterKind : std::uint32_t {
    Level = 0,  // a magnitude; GetMeter reads it in dB
    Value = 1,  // a number in its unit (a correlation, a loudness); GetMeter reads it as is
    Array = 2,  // `size` values published together (a spectrum, band levels); ReadMeterArray
    Ring = 3,   // a history of records of `size` values (goniometer points); ReadMeterRing
};

struct MeterInfo {
    // Stable once released (LV2 port symbols and JSON keys come from it):
    // class name, "::" and an upper-case name, with the channel number for a
    // meter per channel: "ZenSoftClipper::INPUT_PEAK_1".
    std::string identifier;
    std::string name;  // "Input Peak 1", "Gain Reduction"
    std::string unit;  // "dB", "dBTP", or empty
    float minimum = 0.0f;  // display range; readings may leave it
    float maximum = 0.0f;
    MeterKind kind = MeterKind::Level;
    std::uint32_t size = 1;      // values per reading: 1, an array's length, a ring record's width
    std::uint32_t capacity = 0;  // rings: records held before the oldest is overwritten
};

// What one ReadMeterRing call delivered.
struct MeterRingRead {
    std::uint32_t records = 0;  // records copied
    std::uint64_t lost = 0;     // records overwritten before this reader got to them
};

}  // namespace zen
