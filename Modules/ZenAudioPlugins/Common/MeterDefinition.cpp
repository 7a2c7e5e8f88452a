#include "MeterDefinition.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

namespace zen {

MeterDefinition MeterDefinition::PerChannel() const {
    MeterDefinition d = *this;
    d.perChannel = true;
    return d;
}

MeterDefinition MeterDefinition::Floor(float db) const {
    MeterDefinition d = *this;
    d.floorDb = db;
    d.readsAboveFloorOnly = true;
    return d;
}

MeterDefinition MeterDefinition::SilenceReads(float db) const {
    MeterDefinition d = *this;
    d.floorDb = db;
    d.readsAboveFloorOnly = false;
    return d;
}

MeterDefinition MeterDefinition::AtRest(float value) const {
    MeterDefinition d = *this;
    d.restValue = value;
    return d;
}

float MeterDefinition::Reading(float published) const {
    if (kind != MeterKind::Level) return published;
    if (!(published > 0.0f)) return floorDb;
    const float db = 20.0f * std::log10(published);
    return readsAboveFloorOnly ? std::max(db, floorDb) : db;
}

namespace {

MeterDefinition Row(MeterKind kind, const char* name, const char* label, const char* unit, float minimum,
                    float maximum) {
    MeterDefinition d;
    d.kind = kind;
    d.identifier = QString::fromLatin1(name);
    d.name = QString::fromUtf8(label);
    d.unit = QString::fromUtf8(unit);
    d.minimum = minimum;
    d.maximum = maximum;
    return d;
}

}  // namespace

MeterDefinition LevelMeter(const char* name, const char* label, const char* unit, float minimum, float maximum) {
    return Row(MeterKind::Level, name, label, unit, minimum, maximum);
}

MeterDefinition ValueMeter(const char* name, const char* label, const char* unit, float minimum, float maximum) {
    return Row(MeterKind::Value, name, label, unit, minimum, maximum);
}

MeterDefinition ArrayMeter(const char* name, const char* label, const char* unit, float minimum, float maximum,
                           std::uint32_t size) {
    MeterDefinition d = Row(MeterKind::Array, name, label, unit, minimum, maximum);
    d.size = std::max(1u, size);
    return d;
}

MeterDefinition RingMeter(const char* name, const char* label, const char* unit, float minimum, float maximum,
                          std::uint32_t recordWidth, std::uint32_t capacity) {
    MeterDefinition d = Row(MeterKind::Ring, name, label, unit, minimum, maximum);
    d.size = std::max(1u, recordWidth);
    d.capacity = std::max(1u, capacity);
    return d;
}

MeterTableDefinition MakeMeterTable(const char* className, std::vector<MeterDefinition> rows) {
    const QString prefix = QString::fromLatin1(className) + QStringLiteral("::");
    for (std::size_t i = 0; i < rows.size(); ++i) {
        MeterDefinition& d = rows[i];
        d.index = static_cast<std::uint32_t>(i);
        d.identifier = prefix + d.identifier;
        d.name = QCoreApplication::translate(className, d.name.toUtf8().constData());
    }
    return rows;
}

}  // namespace zen
