// The text form of a plug-in's settings, and its presets: the factory ones
// carried in the library's resource trees (":/<ClassName>/Presets/<Name>.json",
// each a state text) and the user's own, the same files in
// $XDG_DATA_HOME/ZenAudioPlugins/Presets/<ClassName>/ (default
// ~/.local/share/...), listed after the factory ones. A user's preset never
// replaces a factory preset of the same name.
#pragma once

#include <QJsonObject>
#include <QString>
#include <cstdint>
#include <string>
#include <utility>
#include <vector>

#include "ParameterTable.h"

namespace zen::StateText {

struct Contents {
    std::vector<std::pair<std::uint32_t, float>> values;
    QJsonObject root;  // for fields a plug-in adds (bypass)
};

// A JSON object naming the class and every parameter by identifier; `extra`
// fields are merged in.
std::string Save(const char* className, const ParameterTable& table, const QJsonObject& extra = {});

// False for malformed text, a state of another class, or a parameter without
// a finite number.
bool Parse(const std::string& text, const char* className, const ParameterTable& table, Contents& out);

// Factory presets by name, then the user's presets not named like one.
std::vector<std::string> PresetNames(const char* className);
// The user's preset folder of a class; empty when no home is known.
std::string UserPresetFolder(const char* className);
bool ReadPreset(const char* className, const std::string& name, std::string& text);

}  // namespace zen::StateText
