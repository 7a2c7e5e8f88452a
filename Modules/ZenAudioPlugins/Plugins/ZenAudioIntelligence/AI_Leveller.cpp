#include "AI_Leveller.h"

#include "zen/LevellerEngine.h"

// Levelling and applying on, hold through pauses and manage loud dialogue;
// the ranges and the attack are left as the engine has them.
AI_Leveller::AI_Leveller(AITemplateOwner& owner)
    : AILevellerControlTemplate(owner, "AI_Leveller",
                                {"LEVELLING_MODE", "UI_RIDER_CURVE", "UI_LIFTER_CURVE", "UI_GATE_CURVE",
                                 "MANAGE_LOUD_DIALOGUE", "REDUCE_BACKGROUND"},
                                {{33, 1.0f}, {34, 1.0f}, {1, zen::levelling::kNoValue}, {2, zen::levelling::kNoValue},
                                 {3, zen::levelling::kNoValue},
                                 {10, 1.0f}, {14, 1.0f}}) {
    AddCurveMappings(kRiderCurve, kLifterCurve, kGateCurve);
}
