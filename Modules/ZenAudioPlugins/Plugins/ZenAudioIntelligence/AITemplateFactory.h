// The ten control templates by number (the descriptor's template field and
// the "Template" choice of the "AI" row).
#pragma once

#include <array>
#include <memory>

#include "AIControlTemplate.h"

namespace ai_templates {

inline constexpr std::array<const char*, 10> kNames = {
    "AI_Dialog",         "AI_Music",      "AI_SFX",      "AI_Ambience", "AI_VoiceOverRecording",
    "AI_DialogAdvanced", "AI_LevelRider", "AI_Leveller", "AI_Master",   "AI_DialogRider"};

// Null for a number outside 0..9.
std::unique_ptr<AIControlTemplate> Make(int number, AITemplateOwner& owner);

}  // namespace ai_templates
