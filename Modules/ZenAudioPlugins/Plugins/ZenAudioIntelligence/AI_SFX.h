// Sound effects: "Crunch" through the "Distortion" and a room through the
// "Reverb". Values for both read as per-mille of the target's range.
#pragma once

#include "AIControlTemplate.h"

class AI_SFX : public AIControlTemplate {
public:
    enum Control : std::size_t { kCrunch, kCrunchAmount, kReverbOn, kReverbSize, kReverbAmount };

    explicit AI_SFX(AITemplateOwner& owner);

    // The reverb's defaults, its switch and its size and amount mappings at
    // control indexes on .. on + 2 (shared with AI_Ambience).
    static void AddReverbTables(AIControlTemplate& t, std::size_t on);
};
