#include "StageSettings.h"

#include <sstream>

#include "NameSuggestions.h"
#include "ParameterValue.h"
#include "ZenfxError.h"

namespace zenfx {

namespace {
constexpr const char* kTemplateParameter = "Template";
}

StageSettings::StageSettings(AudioPlugin& audio, std::string pluginName, Warn warn)
    : m_audio(audio), m_name(std::move(pluginName)), m_warn(std::move(warn)) {}

void StageSettings::Set(const std::string& assignment) {
    const std::size_t equals = assignment.find('=');
    if (equals == std::string::npos || equals == 0)
        throw ZenfxError("--set '" + assignment + "' is not PARAM=VALUE", kExitUsage);
    const std::uint32_t index = FindParameter(m_audio, m_name, assignment.substr(0, equals));
    zen::ParameterInfo info;
    m_audio.GetParameterInfo(index, info);
    const ParsedValue parsed = ParseParameterValue(info, m_name, assignment.substr(equals + 1));
    if (!m_audio.SetParameter(index, parsed.value)) throw ZenfxError("'" + m_name + "' refused " + assignment);

    const auto earlier = m_set.find(index);
    if (earlier != m_set.end())
        m_warn("--set '" + assignment + "' for '" + m_name + "' replaces the earlier --set '" +
               earlier->second.first + "'");
    // A fraction is the likely meaning of 0.5 for a percentage.
    if (parsed.bare && info.unit == "%" && parsed.value > 0.0f && parsed.value <= 1.0f) {
        std::ostringstream percent;
        percent << static_cast<double>(parsed.value) * 100.0;
        m_warn("--set '" + assignment + "' for '" + m_name + "' is " + FormatParameterValue(info, parsed.value) +
               "; for " + percent.str() + " % write " + info.label + "=" + percent.str() + "%");
    }
    m_set[index] = {assignment, m_audio.GetParameter(index)};
}

void StageSettings::LoadPreset(const std::string& preset) {
    const std::vector<std::string> names = m_audio.GetPresetNames();
    std::string found;
    for (const std::string& name : names)
        if (EqualsIgnoreCase(name, preset)) found = name;
    if (found.empty())
        throw ZenfxError("'" + m_name + "' has no preset '" + preset + "'" + DidYouMean(preset, names));
    if (!m_audio.LoadPreset(found))
        throw ZenfxError("preset '" + found + "' of '" + m_name + "' could not be loaded");

    if (!m_preset.empty())
        m_warn("--preset '" + found + "' for '" + m_name + "' replaces the earlier --preset '" + m_preset + "'");
    for (const auto& [index, set] : m_set)
        if (m_audio.GetParameter(index) != set.second)
            m_warn("--preset '" + found + "' for '" + m_name + "' replaces the earlier --set '" + set.first +
                   "' (a --set after the --preset changes the preset's value)");
    m_set.clear();
    m_preset = found;
}

void StageSettings::UseTemplate(const std::string& name) {
    bool found = false;
    for (std::uint32_t i = 0; !found && i < m_audio.GetParameterCount(); ++i) {
        zen::ParameterInfo info;
        found = m_audio.GetParameterInfo(i, info) && info.label == kTemplateParameter;
    }
    if (!found)
        throw ZenfxError("--template " + name + ": '" + m_name + "' has no templates (\"AI\" has)", kExitUsage);
    Set(std::string(kTemplateParameter) + "=" + name);
}

void StageSettings::Apply(const std::vector<std::pair<std::string, std::string>>& actions) {
    for (const auto& [action, argument] : actions) {
        if (action == "--preset") LoadPreset(argument);
        else if (action == "--template") UseTemplate(argument);
        else Set(argument);
    }
}

}  // namespace zenfx
