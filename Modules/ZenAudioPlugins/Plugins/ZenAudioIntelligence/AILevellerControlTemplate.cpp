#include "AILevellerControlTemplate.h"

AILevellerControlTemplate::AILevellerControlTemplate(AITemplateOwner& owner, const char* name,
                                                     std::vector<const char*> controls,
                                                     std::vector<PresetPair> preset)
    : AIControlTemplate(owner, name, std::move(controls)), m_preset(std::move(preset)) {
    for (std::uint32_t i = 0; i < zen::levelling::kParameterCount; ++i)
        m_levellerValues[i] = zen::levelling::kLevellerParameters[i].defaultValue;
}

void AILevellerControlTemplate::SetLevellerParameter(std::uint32_t index, float value) {
    if (index >= zen::levelling::kParameterCount) return;
    m_levellerValues[index] = value;
    Owner().ForwardEngineParameter(index, value);
}

void AILevellerControlTemplate::ApplyPreset() {
    for (const auto& [index, value] : m_preset) {
        if (value == zen::levelling::kNoValue || index >= zen::levelling::kParameterCount) continue;
        Owner().SetEngineParameter(index, value);
    }
}

void AILevellerControlTemplate::AddCurveMappings(std::size_t rider, std::size_t lifter, std::size_t gate) {
    using zen::levelling::kLevellerParameters;
    constexpr float kPercent = 0.01f;
    // At 100 % the engine rides as far as its defaults allow.
    const float mostCut = kLevellerParameters[static_cast<std::size_t>(EngineIndex("Max Cut"))].defaultValue;
    const float mostBoost = kLevellerParameters[static_cast<std::size_t>(EngineIndex("Max Boost"))].defaultValue;
    constexpr float kMostReductionDb = 12.0f;  // all of "Background Reduction"
    if (rider != kNoControl) {
        AddMapping(rider, kEngine, "Reduce Loud Dialogue", kPercent, 0.0f);
        AddMapping(rider, kEngine, "Max Cut", mostCut * kPercent, 0.0f);
    }
    if (lifter != kNoControl) {
        AddMapping(lifter, kEngine, "Lift Soft Dialogue", kPercent, 0.0f);
        AddMapping(lifter, kEngine, "Max Boost", mostBoost * kPercent, 0.0f);
    }
    if (gate != kNoControl) AddMapping(gate, kEngine, "Background Reduction", kMostReductionDb * kPercent, 0.0f);
}
