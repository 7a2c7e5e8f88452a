#include "AI_Leveller.h"

#include "zen/LevellerEngine.h"

// Levelling and applying on, 18 dB either way, hold through pauses; the
// attack is left as the engine has it.
AI_Leveller::AI_Leveller(AITemplateOwner& owner)
    : AILevellerControlTemplate(owner, "AI_Leveller",
                                {"LEVELLING_MODE", "UI_RIDER_CURVE", "UI_LIFTER_CURVE", "UI_GATE_CURVE",
                                 "MANAGE_LOUD_DIALOGUE", "REDUCE_BACKGROUND"},
                                {{33, 1.0f}, {34, 1.0f}, {1, 18.0f}, {2, 18.0f}, {3, zen::levelling::kNoValue},
                                 {10, 1.0f}, {14, 1.0f}}) {
    AddCurveMappings(kRiderCurve, kLifterCurve, kGateCurve);
}
