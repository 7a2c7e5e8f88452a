// The figures a levelled dialogue is judged by:
// - sigma: standard deviation of the short-term loudness (3 s, every
//   100 ms) of the phrases alone, joined without their pauses, LU;
// - integrated: the joined phrases' integrated loudness, LUFS;
// - fastest change: the largest change of the applied gain within any
//   100 ms, dB, from the end of the first entry on (the plug-in starts at
//   unity and settles on the first gain during the lead-in silence);
// - pause pump: by how much the applied gain in a pause rises above the
//   larger of the gains at the end of the phrase before and at the start of
//   the phrase after, dB, the worst pause.
#pragma once

#include <vector>

#include "Support/DialogueFile.h"

namespace zentest {

struct LevellingFigures {
    double sigma = 0.0;
    double integrated = 0.0;
    double fastestChange = 0.0;
    double pausePump = 0.0;
};

// `applied` holds the linear gain applied to each sample (empty: the
// signal's own figures, the gain ones 0).
LevellingFigures MeasureLevelling(const DialogueFile& file, const std::vector<float>& output,
                                  const std::vector<float>& applied);

}  // namespace zentest
