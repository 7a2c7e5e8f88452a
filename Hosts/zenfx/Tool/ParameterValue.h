// Parameters by name and values in their own units, as a user types them.
#pragma once

#include <cstdint>
#include <string>

#include "zen/Zen.h"

namespace zenfx {

// Index of a parameter by label, else by identifier or the upper-case name
// after "::", case-insensitive. Throws ZenfxError with the closest names.
std::uint32_t FindParameter(AudioPlugin& plugin, const std::string& pluginName, const std::string& name);

struct ParsedValue {
    float value = 0.0f;
    bool bare = false;  // a plain number, no unit typed
};

// A typed value in the parameter's unit: "6", "-3 dB", "2.5kHz", "50%";
// list parameters also by caption, switches also as on/off. Decimal numbers
// only (no hexadecimal, no inf or nan). Throws ZenfxError for text that is
// no value and for values out of range (the range, and for a bare number
// the unit it is read in, are said).
ParsedValue ParseParameterValue(const zen::ParameterInfo& info, const std::string& pluginName,
                                const std::string& text);

// "6 dB", "Bell", "on": a value as the user would write it.
std::string FormatParameterValue(const zen::ParameterInfo& info, float value);

// "-18 to 18 dB", "one of LPF, HPF, Bell", "on or off".
std::string DescribeRange(const zen::ParameterInfo& info);

}  // namespace zenfx
