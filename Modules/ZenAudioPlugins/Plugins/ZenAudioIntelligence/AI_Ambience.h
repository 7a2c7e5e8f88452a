// Ambience beds: the reverb of AI_SFX (with "Diffusion", which the Reverb
// does not have: the host skips it) and the "Width Control" group driving
// the "Stereo Width".
#pragma once

#include "AIControlTemplate.h"

class AI_Ambience : public AIControlTemplate {
public:
    enum Control : std::size_t { kReverbOn, kReverbSize, kReverbAmount, kWidthOn, kWidthSize };
    // "Width" chooser: "Narrow", "Natural", "Wide", "Extra Wide" read as
    // 75, 100, 125 and 150 % (per-mille of the 0..200 % range).
    static constexpr float kWidthStep = 125.0f;
    static constexpr float kNarrowWidth = 375.0f;

    explicit AI_Ambience(AITemplateOwner& owner);
};
