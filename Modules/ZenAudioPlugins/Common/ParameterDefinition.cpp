#include "ParameterDefinition.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

namespace zen {

float ParameterDefinition::Constrain(float value) const {
    value = std::min(std::max(value, minimum), maximum);
    if (kind != ParameterKind::Continuous) {
        const float stride = step > 0.0f ? step : 1.0f;
        value = minimum + std::round((value - minimum) / stride) * stride;
        value = std::min(value, maximum);
    }
    return value;
}

ParameterDefinition ParameterDefinition::Smoothed(WorkingValue working) const {
    ParameterDefinition d = SmoothedSingle(working);
    d.smoothedPerChannel = true;
    return d;
}

ParameterDefinition ParameterDefinition::SmoothedSingle(WorkingValue working) const {
    ParameterDefinition d = *this;
    d.smoothing = working;
    d.smoothedPerChannel = false;
    return d;
}

ParameterInfo ParameterDefinition::ToInfo() const {
    ParameterInfo info;
    info.identifier = identifier.toStdString();
    info.label = label.toStdString();
    info.kind = kind;
    info.taper = Taper();
    info.minimum = minimum;
    info.maximum = maximum;
    info.defaultValue = defaultValue;
    info.step = step;
    info.unit = unit.toStdString();
    for (const QString& caption : choices) info.choices.push_back(caption.toStdString());
    info.hostScale = hostScale;
    return info;
}

ParameterDefinition ContinuousParameter(const char* name, const char* label, float minimum, float maximum,
                                        float defaultValue, float step, const char* unit) {
    ParameterDefinition d;
    d.identifier = QString::fromLatin1(name);
    d.label = QString::fromUtf8(label);
    d.minimum = minimum;
    d.maximum = maximum;
    d.defaultValue = defaultValue;
    d.step = step;
    d.unit = QString::fromUtf8(unit);
    return d;
}

ParameterDefinition LogarithmicParameter(const char* name, const char* label, float minimum, float maximum,
                                         float defaultValue, float step, const char* unit) {
    ParameterDefinition d = ContinuousParameter(name, label, minimum, maximum, defaultValue, step, unit);
    d.logarithmic = true;
    return d;
}

ParameterDefinition SwitchParameter(const char* name, const char* label, float defaultValue, const char* unit) {
    ParameterDefinition d = ContinuousParameter(name, label, 0.0f, 1.0f, defaultValue, 1.0f, unit);
    d.kind = ParameterKind::Switch;
    return d;
}

ParameterDefinition ListParameter(const char* name, const char* label, std::initializer_list<const char*> captions,
                                  float defaultValue) {
    const auto last = static_cast<float>(captions.size() > 0 ? captions.size() - 1 : 0);
    ParameterDefinition d = ContinuousParameter(name, label, 0.0f, last, defaultValue, 1.0f);
    d.kind = ParameterKind::List;
    for (const char* caption : captions) d.choices << QString::fromUtf8(caption);
    return d;
}

ParameterTableDefinition MakeParameterTable(const char* className, std::vector<ParameterDefinition> rows,
                                            HostScale hostScale) {
    const QString prefix = QString::fromLatin1(className) + QStringLiteral("::");
    for (std::size_t i = 0; i < rows.size(); ++i) {
        ParameterDefinition& d = rows[i];
        d.index = i;
        if (hostScale != HostScale::OwnValue) d.hostScale = hostScale;
        d.identifier = prefix + d.identifier;
        d.label = QCoreApplication::translate(className, d.label.toUtf8().constData());
        for (QString& caption : d.choices) caption = QCoreApplication::translate(className, caption.toUtf8().constData());
    }
    return rows;
}

}  // namespace zen
