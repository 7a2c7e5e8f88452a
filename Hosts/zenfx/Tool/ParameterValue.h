// Parameters by name and values in their own units, as a user types them.
#pragma once

#include <cstdint>
#include <string>

#include "zen/Zen.h"

namespace zenfx {

// Index of a parameter by label, else by identifier or the upper-case name
// after "::", case-insensitive. Throws ZenfxError with the closest names.
std::uint32_t FindParameter(AudioPlugin& plugin, const std::string& pluginName, const std::string& name);

// A typed value in the parameter's unit: "6", "-3 dB", "2.5kHz", "50%";
// list parameters also by caption, switches also as on/off. Throws
// ZenfxError for text that is no value and for values out of range (the
// range is said).
float ParseParameterValue(const zen::ParameterInfo& info, const std::string& pluginName, const std::string& text);

// "6 dB", "Bell", "on": a value as the user would write it.
std::string FormatParameterValue(const zen::ParameterInfo& info, float value);

// "-18 to 18 dB", "one of LPF, HPF, Bell", "on or off".
std::string DescribeRange(const zen::ParameterInfo& info);

}  // namespace zenfx
