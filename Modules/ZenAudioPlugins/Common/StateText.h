// The text form of a plug-in's settings, and the factory presets carried in
// the library's resource trees (":/<ClassName>/Presets/<Name>.json", each a
// state text).
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

std::vector<std::string> PresetNames(const char* className);
bool ReadPreset(const char* className, const std::string& name, std::string& text);

}  // namespace zen::StateText
