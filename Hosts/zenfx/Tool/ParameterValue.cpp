#include "ParameterValue.h"

#include <cctype>
#include <cmath>
#include <sstream>
#include <vector>

#include "HostCore/Settings/SettingsDocument.h"
#include "NameSuggestions.h"
#include "ZenfxError.h"

namespace zenfx {

namespace {

std::string Trim(const std::string& s) {
    const std::size_t first = s.find_first_not_of(" \t");
    if (first == std::string::npos) return {};
    return s.substr(first, s.find_last_not_of(" \t") - first + 1);
}

std::string FormatNumber(float value) {
    std::ostringstream out;
    out << static_cast<double>(value);
    return out.str();
}

std::string UpperName(const std::string& identifier) {
    const std::size_t colons = identifier.rfind("::");
    return colons == std::string::npos ? identifier : identifier.substr(colons + 2);
}

[[noreturn]] void OutOfRange(const zen::ParameterInfo& info, const std::string& pluginName, const std::string& text,
                             bool bare) {
    const std::string unitNote =
        bare && !info.unit.empty() ? "; a plain number is in " + info.unit + ", as in " + info.label + "=" +
                                         FormatNumber(info.defaultValue) + info.unit
                                   : "";
    throw ZenfxError("value '" + text + "' for '" + info.label + "' of '" + pluginName + "' is out of range (" +
                     DescribeRange(info) + ")" + unitNote);
}

// The longest leading decimal number of `text` ("-2.5e3" of "-2.5e3Hz"), and
// where it ends; false when there is none.
bool LeadingNumber(const std::string& text, double& number, std::size_t& end) {
    end = text.find_first_not_of("+-0123456789.eE");
    if (end == std::string::npos) end = text.size();
    for (; end > 0; --end)
        if (zen::host::ParseNumber(text.substr(0, end), number)) return true;
    return false;
}

}  // namespace

std::uint32_t FindParameter(AudioPlugin& plugin, const std::string& pluginName, const std::string& name) {
    std::vector<zen::ParameterInfo> infos(plugin.GetParameterCount());
    for (std::uint32_t i = 0; i < infos.size(); ++i) plugin.GetParameterInfo(i, infos[i]);
    // Labels first: a label may equal another parameter's upper-case name
    // (the De-Esser's "Range" is ZenDeesser::MODE, not ZenDeesser::RANGE).
    for (std::uint32_t i = 0; i < infos.size(); ++i)
        if (EqualsIgnoreCase(name, infos[i].label)) return i;
    for (std::uint32_t i = 0; i < infos.size(); ++i)
        if (EqualsIgnoreCase(name, infos[i].identifier) || EqualsIgnoreCase(name, UpperName(infos[i].identifier)))
            return i;
    std::vector<std::string> names;
    for (const zen::ParameterInfo& info : infos) {
        names.push_back(info.label);
        names.push_back(info.identifier);
    }
    throw ZenfxError("'" + pluginName + "' has no parameter '" + name + "'" + DidYouMean(name, names) +
                     " (zenfx info '" + pluginName + "' lists them)");
}

ParsedValue ParseParameterValue(const zen::ParameterInfo& info, const std::string& pluginName,
                                const std::string& text) {
    const std::string value = Trim(text);
    if (info.kind == zen::ParameterKind::List) {
        for (std::size_t i = 0; i < info.choices.size(); ++i)
            if (EqualsIgnoreCase(value, info.choices[i])) return {info.minimum + static_cast<float>(i) * info.step};
    }
    if (info.kind == zen::ParameterKind::Switch) {
        for (const char* on : {"on", "true", "yes"})
            if (EqualsIgnoreCase(value, on)) return {1.0f};
        for (const char* off : {"off", "false", "no"})
            if (EqualsIgnoreCase(value, off)) return {0.0f};
    }

    const std::size_t digits = value.find_first_not_of("+-");
    if (digits != std::string::npos && (value.compare(digits, 2, "0x") == 0 || value.compare(digits, 2, "0X") == 0))
        throw ZenfxError("'" + text + "' for '" + info.label + "' of '" + pluginName +
                         "' is hexadecimal; give a decimal value (" + DescribeRange(info) + ")");
    double number = 0.0;
    std::size_t end = 0;
    if (!LeadingNumber(value, number, end)) {
        std::string hint;
        if (info.kind == zen::ParameterKind::List) hint = DidYouMean(value, info.choices);
        throw ZenfxError("'" + text + "' is not a value for '" + info.label + "' of '" + pluginName + "'" + hint +
                         " (" + DescribeRange(info) + ")");
    }
    std::string unit = Trim(value.substr(end));
    const bool bare = unit.empty();
    // "2.5k" and "2.5kHz" for frequencies.
    if (!unit.empty() && (unit[0] == 'k' || unit[0] == 'K') && EqualsIgnoreCase(info.unit, "Hz") &&
        (unit.size() == 1 || EqualsIgnoreCase(unit.substr(1), "Hz"))) {
        number *= 1000.0;
        unit.clear();
    }
    if (!unit.empty() && !EqualsIgnoreCase(unit, info.unit))
        throw ZenfxError("'" + text + "' for '" + info.label + "' of '" + pluginName + "' has the unit '" + unit +
                         "'; it takes " + (info.unit.empty() ? std::string("a plain number") : info.unit));

    const auto result = static_cast<float>(number);
    // A hair of tolerance for values typed with fewer digits than the range's own.
    const float slack = 1e-6f * std::max(1.0f, std::max(std::fabs(info.minimum), std::fabs(info.maximum)));
    if (result < info.minimum - slack || result > info.maximum + slack) OutOfRange(info, pluginName, text, bare);
    if (info.kind != zen::ParameterKind::Continuous) {
        const float stride = info.step > 0.0f ? info.step : 1.0f;
        const float steps = (result - info.minimum) / stride;
        if (std::fabs(steps - std::round(steps)) > 1e-4f)
            throw ZenfxError("'" + text + "' is not a value for '" + info.label + "' of '" + pluginName + "' (" +
                             DescribeRange(info) + ")");
    }
    return {std::min(std::max(result, info.minimum), info.maximum), bare};
}

std::string FormatParameterValue(const zen::ParameterInfo& info, float value) {
    if (info.kind == zen::ParameterKind::List) {
        const float stride = info.step > 0.0f ? info.step : 1.0f;
        const auto index = static_cast<long>(std::lround((value - info.minimum) / stride));
        if (index >= 0 && static_cast<std::size_t>(index) < info.choices.size())
            return info.choices[static_cast<std::size_t>(index)];
    }
    if (info.kind == zen::ParameterKind::Switch) return value >= 0.5f ? "on" : "off";
    return FormatNumber(value) + (info.unit.empty() ? "" : " " + info.unit);
}

std::string DescribeRange(const zen::ParameterInfo& info) {
    if (info.kind == zen::ParameterKind::List && !info.choices.empty()) {
        std::string text = "one of ";
        for (std::size_t i = 0; i < info.choices.size(); ++i) text += (i ? ", " : "") + info.choices[i];
        return text;
    }
    if (info.kind == zen::ParameterKind::Switch) return "on or off";
    return FormatNumber(info.minimum) + " to " + FormatNumber(info.maximum) + (info.unit.empty() ? "" : " " + info.unit);
}

}  // namespace zenfx
