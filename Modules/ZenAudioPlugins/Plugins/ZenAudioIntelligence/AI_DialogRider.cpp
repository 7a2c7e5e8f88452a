#include "AI_DialogRider.h"

// Max Boost and Max Cut 9 dB, attack 2 s, release 4 s, 1 dB/s at most,
// a 2 s loudness window.
AI_DialogRider::AI_DialogRider(AITemplateOwner& owner)
    : AILevellerControlTemplate(owner, "AI_DialogRider",
                                {"LEVELLING_MODE", "REDUCE_LOUD_DIALOGUE", "LIFT_SOFT_DIALOGUE", "BACKGROUND_REDUCTION",
                                 "MANAGE_LOUD_DIALOGUE", "REDUCE_BACKGROUND"},
                                {{33, 1.0f}, {34, 1.0f}, {1, 9.0f}, {2, 9.0f}, {3, 2.0f}, {4, 4.0f}, {6, 1.0f},
                                 {16, 2.0f}}) {}
