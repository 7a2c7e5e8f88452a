// Voice-over from a booth: the dialogue tables, with the expander closing
// faster and lower between lines (booth noise sits far below the voice).
#pragma once

#include "AIControlTemplate.h"

class AI_VoiceOverRecording : public AIControlTemplate {
public:
    enum Control : std::size_t { kLevellingMode, kCleanup, kCleanUpAmount, kEnhance, kEnhanceAmount };

    explicit AI_VoiceOverRecording(AITemplateOwner& owner);
};
