#include "AI_Master.h"

AI_Master::AI_Master(AITemplateOwner& owner)
    : AILevellerControlTemplate(owner, "AI_Master", {"LEVELLING_MODE", "UI_RIDER_CURVE", "UI_LIFTER_CURVE", "BOOST_AMOUNT"},
                                {{33, 1.0f}, {34, 1.0f}, {10, 1.0f}, {14, 1.0f}}) {
    AddDefault(kLimiter, "Soft", 1000.0f);
    AddDefault(kLimiter, "Ceiling", kCeilingPerMille);
    AddDefault(kLimiter, "Release", kReleasePerMille);
    AddMapping(kBoostAmount, kLimiter, "Input Gain", 0.4f, 500.0f);
    AddCurveMappings(kRiderCurve, kLifterCurve, kNoControl);
}
