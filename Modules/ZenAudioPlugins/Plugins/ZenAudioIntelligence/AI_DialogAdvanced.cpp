#include "AI_DialogAdvanced.h"

#include "AI_Dialog.h"

AI_DialogAdvanced::AI_DialogAdvanced(AITemplateOwner& owner)
    : AILevellerControlTemplate(owner, "AI_DialogAdvanced",
                                {"LEVELLING_MODE", "CLEANUP", "CLEANUP_AMOUNT", "ENHANCE", "ENHANCE_AMOUNT",
                                 "UI_RIDER_CURVE", "UI_LIFTER_CURVE", "UI_GATE_CURVE"},
                                {{33, 1.0f}, {34, 1.0f}, {10, 1.0f}, {14, 1.0f}}) {
    AI_Dialog::AddDialogueTables(*this, kCleanup);
    AddMapping(kEnhanceAmount, kDialogueProcessor, "Exciter Amount", 0.4f, 0.0f);
    AddCurveMappings(kRiderCurve, kLifterCurve, kGateCurve);
}
