// Riding only: the engine follows the dialogue faster than the leveller,
// within the rider and lifter curves; no plug-ins are loaded.
#pragma once

#include "AILevellerControlTemplate.h"

class AI_LevelRider : public AILevellerControlTemplate {
public:
    enum Control : std::size_t { kLevellingMode, kRiderCurve, kLifterCurve, kGateCurve };

    explicit AI_LevelRider(AITemplateOwner& owner);
};
