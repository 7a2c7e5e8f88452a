#include "StateText.h"

#include <QDir>
#include <QFile>
#include <QJsonDocument>
#include <algorithm>
#include <cstdlib>

namespace zen::StateText {

namespace {

const QString kFormat = QStringLiteral("ZenAudioPlugins state");

QString PresetFolder(const char* className) {
    return QStringLiteral(":/%1/Presets").arg(QString::fromLatin1(className));
}

QStringList JsonFiles(const QString& folder) {
    return QDir(folder, QStringLiteral("*.json"), QDir::Name, QDir::Files | QDir::Readable).entryList();
}

QString PresetFile(const QString& folder, const std::string& name) {
    return folder + QLatin1Char('/') + QString::fromStdString(name) + QStringLiteral(".json");
}

bool ReadFile(const QString& path, std::string& text) {
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly)) return false;
    text = file.readAll().toStdString();
    return true;
}

}  // namespace

std::string Save(const char* className, const ParameterTable& table, const QJsonObject& extra) {
    QJsonObject root = extra;
    root.insert(QStringLiteral("format"), kFormat);
    root.insert(QStringLiteral("class"), QString::fromLatin1(className));
    root.insert(QStringLiteral("parameters"), table.ToJson());
    return QJsonDocument(root).toJson(QJsonDocument::Indented).toStdString();
}

bool Parse(const std::string& text, const char* className, const ParameterTable& table, Contents& out) {
    QJsonParseError error{};
    const QJsonDocument document =
        QJsonDocument::fromJson(QByteArray::fromRawData(text.data(), static_cast<int>(text.size())), &error);
    if (error.error != QJsonParseError::NoError || !document.isObject()) return false;
    const QJsonObject root = document.object();
    const QJsonValue stateClass = root.value(QStringLiteral("class"));
    if (!stateClass.isUndefined() && stateClass.toString() != QString::fromLatin1(className)) return false;
    const QJsonValue parameters = root.value(QStringLiteral("parameters"));
    if (!parameters.isObject()) return false;
    if (!table.FromJson(parameters.toObject(), out.values)) return false;
    out.root = root;
    return true;
}

std::string UserPresetFolder(const char* className) {
    std::string data;
    if (const char* xdg = std::getenv("XDG_DATA_HOME"); xdg != nullptr && xdg[0] == '/') {
        data = xdg;
    } else {
        const char* home = std::getenv("HOME");
        if (home == nullptr || home[0] != '/') return {};
        data = std::string(home) + "/.local/share";
    }
    return data + "/ZenAudioPlugins/Presets/" + className;
}

std::vector<std::string> PresetNames(const char* className) {
    std::vector<std::string> names;
    for (const QString& file : JsonFiles(PresetFolder(className))) names.push_back(file.chopped(5).toStdString());
    const std::size_t factoryCount = names.size();
    const std::string userFolder = UserPresetFolder(className);
    if (userFolder.empty()) return names;
    std::vector<std::string> user;
    for (const QString& file : JsonFiles(QString::fromStdString(userFolder))) {
        std::string name = file.chopped(5).toStdString();
        // A factory preset keeps its name: a user's file of the same name is not offered.
        if (std::find(names.begin(), names.begin() + static_cast<std::ptrdiff_t>(factoryCount), name) ==
            names.begin() + static_cast<std::ptrdiff_t>(factoryCount))
            user.push_back(std::move(name));
    }
    names.insert(names.end(), user.begin(), user.end());
    return names;
}

bool ReadPreset(const char* className, const std::string& name, std::string& text) {
    if (ReadFile(PresetFile(PresetFolder(className), name), text)) return true;
    const std::string userFolder = UserPresetFolder(className);
    return !userFolder.empty() && ReadFile(PresetFile(QString::fromStdString(userFolder), name), text);
}

}  // namespace zen::StateText
