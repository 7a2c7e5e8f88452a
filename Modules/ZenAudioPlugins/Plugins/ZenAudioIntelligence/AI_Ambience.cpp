#include "AI_Ambience.h"

#include "AI_SFX.h"

AI_Ambience::AI_Ambience(AITemplateOwner& owner)
    : AIControlTemplate(owner, "AI_Ambience",
                        {"REVERB_ON", "REVERB_SIZE", "REVERB_AMOUNT", "WIDTH_ON", "WIDTH_SIZE"}) {
    AI_SFX::AddReverbTables(*this, kReverbOn);
    AddDefault(kReverb, "Diffusion", 350.0f);
    AddMapping(kWidthOn, kStereoWidth, kInternalBypass, -1000.0f, 1000.0f);
    AddMapping(kWidthSize, kStereoWidth, "Width", kWidthStep, kNarrowWidth);
}
