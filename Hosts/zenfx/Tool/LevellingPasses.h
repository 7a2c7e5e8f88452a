// zenfx process with a levelling "AI" in the chain ("Dialogue Leveller",
// "Dialogue Leveler", or "AI" with "Levelling" on): the levelling engine
// needs the whole file before the gain list is final, so a first pass runs
// the chain over the input (and on with silence to the end of its last
// entry) with "Apply Gain List" off, handing the plug-ins
// their background work after every block and once more at the input's end;
// then every stage is reset (the plug-in keeps its gain list) and "Apply
// Gain List" goes on for the pass that writes the file. There is no one-pass
// lookahead mode.
#pragma once

#include <cstdint>
#include <functional>
#include <memory>

#include "AudioFile.h"
#include "HostCore/Studio/StudioModel.h"

namespace zenfx {

// Runs the analysis pass when a slot of the studio's prepared `channel`
// levels; `open` gives a fresh source of the input. False when none levels
// (nothing is run).
bool RunLevellingPasses(zen::host::StudioModel& studio, std::size_t channel,
                        const std::function<std::unique_ptr<AudioSource>()>& open, std::uint32_t block);

}  // namespace zenfx
