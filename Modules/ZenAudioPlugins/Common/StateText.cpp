#include "StateText.h"

#include <QDir>
#include <QFile>
#include <QJsonDocument>

namespace zen::StateText {

namespace {

const QString kFormat = QStringLiteral("ZenAudioPlugins state");

QString PresetFolder(const char* className) {
    return QStringLiteral(":/%1/Presets").arg(QString::fromLatin1(className));
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

std::vector<std::string> PresetNames(const char* className) {
    std::vector<std::string> names;
    const QDir folder(PresetFolder(className), QStringLiteral("*.json"), QDir::Name, QDir::Files);
    for (const QString& file : folder.entryList()) names.push_back(file.chopped(5).toStdString());
    return names;
}

bool ReadPreset(const char* className, const std::string& name, std::string& text) {
    QFile file(PresetFolder(className) + QLatin1Char('/') + QString::fromStdString(name) + QStringLiteral(".json"));
    if (!file.open(QIODevice::ReadOnly)) return false;
    text = file.readAll().toStdString();
    return true;
}

}  // namespace zen::StateText
