#include "AI_Music.h"

AI_Music::AI_Music(AITemplateOwner& owner)
    : AIControlTemplate(owner, "AI_Music",
                        {"MUSIC_LEVEL", "NORMALIZED", "DUCK_ON", "BOOST_ON", "BOOST_AMOUNT", "DUCK_AMOUNT"}) {
    AddDefault(kLimiter, "Soft", 1000.0f);
    AddDefault(kLimiter, "Release", 400.0f);
    AddDefault(kLimiter, "Ceiling", 379.0f);
    AddMapping(kMusicLevel, kLimiter, "Ceiling", kLevelStep, kQuietCeiling);
    AddMapping(kNormalized, kEngine, "Levelling", 1.0f, 0.0f);
    AddMapping(kNormalized, kEngine, "Apply Gain List", 1.0f, 0.0f);
    AddMapping(kBoost, kLimiter, kInternalBypass, -1000.0f, 1000.0f);
    AddMapping(kBoostAmount, kLimiter, "Input Gain", 0.4f, 500.0f);
}

void AI_Music::SetValue(std::size_t control, float value) {
    if (control == kBoostAmount) qCDebug(zen::aiTrace, "Boost: %f", static_cast<double>(value));
    AIControlTemplate::SetValue(control, value);
    // Ducking is the switch times the amount, which no straight line gives.
    if (control == kAutoDuck || control == kDuckAmount) {
        const float duck = Value(kAutoDuck) > 0.5f ? Value(kDuckAmount) : 0.0f;
        Owner().SetEngineParameter(static_cast<std::uint32_t>(EngineIndex("Music Ducking")), duck);
    }
}
