// Dialogue with levelling: the dialogue tables ("EnhanceAmount" also drives
// the exciter), the rider, lifter and gate curves, and levelling on.
#pragma once

#include "AILevellerControlTemplate.h"

class AI_DialogAdvanced : public AILevellerControlTemplate {
public:
    enum Control : std::size_t {
        kLevellingMode, kCleanup, kCleanUpAmount, kEnhance, kEnhanceAmount, kRiderCurve, kLifterCurve, kGateCurve
    };

    explicit AI_DialogAdvanced(AITemplateOwner& owner);
};
