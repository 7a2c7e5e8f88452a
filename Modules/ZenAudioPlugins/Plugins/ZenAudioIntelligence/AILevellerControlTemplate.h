// A template of the leveller family: keeps the 38 levelling-engine values it
// has forwarded and carries a preset, (engine index, value) pairs the
// plug-in starts with on the template's own registry row. A pair whose value
// is kNoValue, or whose index is above 37, is skipped.
#pragma once

#include <array>
#include <utility>

#include "AIControlTemplate.h"
#include "zen/LevellerEngine.h"

class AILevellerControlTemplate : public AIControlTemplate {
public:
    using PresetPair = std::pair<std::uint32_t, float>;

    AILevellerControlTemplate(AITemplateOwner& owner, const char* name, std::vector<const char*> controls,
                              std::vector<PresetPair> preset);

    // Stores and forwards; indexes above 37 are ignored.
    void SetLevellerParameter(std::uint32_t index, float value) override;
    // Sets the plug-in's engine parameters from the preset.
    void ApplyPreset();

    // "Rider Curve", "Lifter Curve" and "Gate Curve" (0..100 %) at these
    // control indexes (kNoControl: none): how much of a cut, of a lift and of
    // the pause reduction the engine may apply.
    static constexpr std::size_t kNoControl = ~std::size_t{0};
    void AddCurveMappings(std::size_t rider, std::size_t lifter, std::size_t gate);

    const std::vector<PresetPair>& Preset() const { return m_preset; }
    float LevellerValue(std::uint32_t index) const { return m_levellerValues.at(index); }

private:
    std::array<float, zen::levelling::kParameterCount> m_levellerValues{};
    std::vector<PresetPair> m_preset;
};
