#include "AI_LevelRider.h"

// Levelling and applying on, attack 0.8 s, release 1.6 s, hold through pauses.
AI_LevelRider::AI_LevelRider(AITemplateOwner& owner)
    : AILevellerControlTemplate(owner, "AI_LevelRider",
                                {"LEVELLING_MODE", "UI_RIDER_CURVE", "UI_LIFTER_CURVE", "UI_GATE_CURVE"},
                                {{33, 1.0f}, {34, 1.0f}, {3, 0.8f}, {4, 1.6f}, {10, 1.0f}}) {
    AddCurveMappings(kRiderCurve, kLifterCurve, kGateCurve);
}
