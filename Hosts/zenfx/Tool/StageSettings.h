// The --set, --preset and --template of one plug-in of a chain, applied in command-line
// order, with a warning wherever a later one silently undoes an earlier one
// (a parameter set twice, a preset over values set before it) or a value is
// likely not what was meant (Amount=0.5 on a percent parameter is 0.5 %).
#pragma once

#include <functional>
#include <map>
#include <string>
#include <utility>
#include <vector>

#include "zen/Zen.h"

namespace zenfx {

class StageSettings {
public:
    using Warn = std::function<void(const std::string&)>;

    StageSettings(AudioPlugin& audio, std::string pluginName, Warn warn);

    // "PARAM=VALUE" in the parameter's unit; throws ZenfxError.
    void Set(const std::string& assignment);
    // A factory preset by name, any case; throws ZenfxError.
    void LoadPreset(const std::string& preset);
    // The plug-in's control template by name ("AI": its "Template" list).
    void UseTemplate(const std::string& name);

    // Each {"--set", "PARAM=VALUE"}, {"--preset", NAME} or {"--template",
    // NAME} in order.
    void Apply(const std::vector<std::pair<std::string, std::string>>& actions);

private:
    AudioPlugin& m_audio;
    std::string m_name;
    Warn m_warn;
    std::map<std::uint32_t, std::pair<std::string, float>> m_set;  // by index: the assignment and its value
    std::string m_preset;                                             // the last preset loaded
};

}  // namespace zenfx
