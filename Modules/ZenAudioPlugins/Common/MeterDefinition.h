// Static definition of one meter of a plug-in class, declared like the
// parameters: a class builds its table once and every instance shares it.
//
//   static const MeterTableDefinition table = MakeMeterTable("ZenSoftClipper", {
//       LevelMeter("CLIPPING", QT_TRANSLATE_NOOP("ZenSoftClipper", "Clipping"), "dBFS", -60.0f, 24.0f),
//       LevelMeter("INPUT_PEAK", QT_TRANSLATE_NOOP("ZenSoftClipper", "Input Peak"), "dBFS", -60.0f, 6.0f)
//           .PerChannel(),
//       ...});
//
// A row's index in the table is what the plug-in publishes to
// (PublishMeter(kInputPeak, channel, peak)). Hosts see the rows expanded in
// order, a per-channel row as one meter per channel named with the channel
// number, and consecutive per-channel rows channel by channel: "Clipping",
// "Input Peak 1", "Output Peak 1", "Input Peak 2", "Output Peak 2".
#pragma once

#include <QString>
#include <cstdint>
#include <vector>

#include "Decibels.h"
#include "zen/ParameterInfo.h"

namespace zen {

struct MeterDefinition {
    std::uint32_t index = 0;  // row in the class's table
    QString identifier;       // class name, "::" and the upper-case name
    QString name;             // translated display name
    QString unit;
    float minimum = 0.0f;  // display range
    float maximum = 0.0f;
    MeterKind kind = MeterKind::Level;
    bool perChannel = false;
    // Level meters: the reading for silence, and whether quieter readings
    // stop there too.
    float floorDb = kMeterFloorDb;
    bool readsAboveFloorOnly = true;
    // Published after Prepare and Reset (level meters: linear).
    float restValue = 0.0f;
    std::uint32_t size = 1;      // array length or ring record width
    std::uint32_t capacity = 0;  // ring records

    MeterDefinition PerChannel() const;
    // Silence and anything quieter read `db`.
    MeterDefinition Floor(float db) const;
    // Only silence reads `db`; any other magnitude reads its own level.
    MeterDefinition SilenceReads(float db) const;
    MeterDefinition AtRest(float value) const;

    // The host's reading of a published value.
    float Reading(float published) const;
};

using MeterTableDefinition = std::vector<MeterDefinition>;

// Rows hold the upper-case name in `identifier` and the untranslated name;
// the table builder prefixes the class name, numbers the rows and translates
// names in the class's context.
MeterDefinition LevelMeter(const char* name, const char* label, const char* unit, float minimum, float maximum);
MeterDefinition ValueMeter(const char* name, const char* label, const char* unit, float minimum, float maximum);
MeterDefinition ArrayMeter(const char* name, const char* label, const char* unit, float minimum, float maximum,
                           std::uint32_t size);
MeterDefinition RingMeter(const char* name, const char* label, const char* unit, float minimum, float maximum,
                          std::uint32_t recordWidth, std::uint32_t capacity);

MeterTableDefinition MakeMeterTable(const char* className, std::vector<MeterDefinition> rows);

}  // namespace zen
