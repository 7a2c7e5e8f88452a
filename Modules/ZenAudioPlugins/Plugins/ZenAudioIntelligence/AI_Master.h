// "Mix Assistant": levelling of the whole mix's dialogue and a safety
// "Limiter" (soft stage, -1 dBFS ceiling, 100 ms release) that "Boost
// Amount" drives into.
#pragma once

#include "AILevellerControlTemplate.h"

class AI_Master : public AILevellerControlTemplate {
public:
    enum Control : std::size_t { kLevellingMode, kRiderCurve, kLifterCurve, kBoostAmount };
    static constexpr float kCeilingPerMille = 958.0f;  // -1.0 dBFS of -24..0
    static constexpr float kReleasePerMille = 100.0f;  // 100 ms of 0..1000

    explicit AI_Master(AITemplateOwner& owner);
};
