// Static definition of one parameter of a plug-in or algorithm class. A class
// builds its whole table once (a function-local static) and every instance
// shares it:
//
//   static const ParameterTableDefinition table = MakeParameterTable("BiQuad", {
//       SwitchParameter("IN", QT_TRANSLATE_NOOP("BiQuad", "In"), 0),
//       ListParameter("SHAPE", QT_TRANSLATE_NOOP("BiQuad", "Shape"), {"LPF", ...}, 4),
//       ...});
//
// A plug-in's row also says how the value reaches the audio path: stepped
// (the default; UpdateProcessingParameter on the audio thread before the next
// block), or smoothed through a working-value conversion:
//
//   ContinuousParameter("GAIN", ..., "dB").Smoothed(working::DbToGain)       // one element per channel
//   ContinuousParameter("CEILING", ..., "dB").SmoothedSingle(CeilingGain)   // one for the plug-in
#pragma once

#include <QString>
#include <QStringList>
#include <cstdint>
#include <initializer_list>
#include <vector>

#include "WorkingValues.h"
#include "zen/ParameterInfo.h"

namespace zen {

struct ParameterDefinition {
    std::uint64_t index = 0;  // position in the class's table
    QString identifier;       // class name, "::" and the upper-case name
    QString label;            // translated display name
    ParameterKind kind = ParameterKind::Continuous;
    bool logarithmic = false;
    float minimum = 0.0f;
    float maximum = 1.0f;
    float defaultValue = 0.0f;
    float step = 0.0f;
    QString unit;
    QStringList choices;  // translated captions, list parameters only
    // Plug-in parameters only: null for a stepped parameter, else the
    // conversion to the smoothed working value.
    WorkingValue smoothing = nullptr;
    bool smoothedPerChannel = false;  // one smoothed element per channel, or one in all
    HostScale hostScale = HostScale::OwnValue;  // how "SetIntParameter" reads this parameter

    bool IsSmoothed() const { return smoothing != nullptr; }
    // This row, smoothed through `working`: one element per channel, or one.
    ParameterDefinition Smoothed(WorkingValue working) const;
    ParameterDefinition SmoothedSingle(WorkingValue working) const;

    ParameterTaper Taper() const {
        if (kind == ParameterKind::List) return ParameterTaper::List;
        return logarithmic ? ParameterTaper::Logarithmic : ParameterTaper::Linear;
    }

    // Nearest value the parameter can hold: inside the range, and a whole
    // step of a switch or list. NaN is not a value; callers refuse it first.
    float Constrain(float value) const;

    ParameterInfo ToInfo() const;
};

using ParameterTableDefinition = std::vector<ParameterDefinition>;

// Rows hold the upper-case name in `identifier` and the untranslated label;
// the table builder prefixes the class name, numbers the rows and translates
// labels and captions in the class's context.
ParameterDefinition ContinuousParameter(const char* name, const char* label, float minimum, float maximum,
                                        float defaultValue, float step, const char* unit = "");
ParameterDefinition LogarithmicParameter(const char* name, const char* label, float minimum, float maximum,
                                         float defaultValue, float step, const char* unit = "");
ParameterDefinition SwitchParameter(const char* name, const char* label, float defaultValue,
                                    const char* unit = "");
ParameterDefinition ListParameter(const char* name, const char* label, std::initializer_list<const char*> captions,
                                  float defaultValue);

// `hostScale`: the scale of every row (a class whose host integers are all
// places along the controls declares PerMille once).
ParameterTableDefinition MakeParameterTable(const char* className, std::vector<ParameterDefinition> rows,
                                            HostScale hostScale = HostScale::OwnValue);

}  // namespace zen
