// Note values for tempo-synced times and rates. Hosts pass no tempo, so a
// synced plug-in takes it from a "Tempo" parameter in BPM and a note value
// from a list parameter made here: "Off", then "1/32" to "4/1" with triplets
// (T) and dotted values (D).
#pragma once

#include "../ParameterDefinition.h"

namespace zen {

ParameterDefinition NoteValueParameter(const char* name, const char* label, float defaultValue);
// Quarter notes in the list's value `index`; 0 for "Off" or out of range.
double NoteValueBeats(int index);
// Milliseconds of that note value at `bpm`.
inline double NoteValueMs(int index, double bpm) { return NoteValueBeats(index) * 60000.0 / bpm; }

}  // namespace zen
