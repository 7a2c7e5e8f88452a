// "Dialogue Leveler": a gentler rider (9 dB either way, slower times, a
// lower slope limit) with the engine's dialogue controls shown directly.
#pragma once

#include "AILevellerControlTemplate.h"

class AI_DialogRider : public AILevellerControlTemplate {
public:
    explicit AI_DialogRider(AITemplateOwner& owner);
};
