// "Dialogue Leveller": levelling to the mode's target with the engine's
// standard ranges and times, the rider, lifter and gate curves and the two
// switches.
#pragma once

#include "AILevellerControlTemplate.h"

class AI_Leveller : public AILevellerControlTemplate {
public:
    enum Control : std::size_t {
        kLevellingMode, kRiderCurve, kLifterCurve, kGateCurve, kManageLoudDialogue, kReduceBackground
    };

    explicit AI_Leveller(AITemplateOwner& owner);
};
