// Music beds: the "Limiter" (soft stage on, 400 ms release, ceiling by
// "Music Level"), "Boost" into it, and levelling and ducking through the
// plug-in's own engine.
#pragma once

#include "AIControlTemplate.h"

class AI_Music : public AIControlTemplate {
public:
    enum Control : std::size_t { kMusicLevel, kNormalized, kAutoDuck, kBoost, kBoostAmount, kDuckAmount };
    // "Music Level" steps the ceiling by 3 dB (125 per-mille of the Limiter's
    // 24 dB); "Normal" lands on the default 379 (-14.9 dBFS).
    static constexpr float kLevelStep = 125.0f;
    static constexpr float kQuietCeiling = 129.0f;

    explicit AI_Music(AITemplateOwner& owner);

    void SetValue(std::size_t control, float value) override;
};
