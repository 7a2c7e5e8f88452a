// Dialogue: the "Dialogue Processor" driven by clean-up and enhancement
// controls, and the levelling mode.
#pragma once

#include <array>
#include <utility>

#include "AIControlTemplate.h"

class AI_Dialog : public AIControlTemplate {
public:
    enum Control : std::size_t { kLevellingMode, kCleanup, kCleanUpAmount, kEnhance, kEnhanceAmount, kBalanceLevel };

    // Carried as the template holds them; nothing in this library reads them.
    static constexpr std::array<std::pair<int, int>, 6> kIntegerPairs = {
        {{1, 1}, {1, 1}, {2, 0}, {3, 400}, {4, 0}, {5, 600}}};

    explicit AI_Dialog(AITemplateOwner& owner);

    // The dialogue processor's defaults and the clean-up and enhancement
    // mappings, with "Cleanup", "CleanUpAmount", "Enhance" and
    // "EnhanceAmount" at control indexes cleanup .. cleanup + 3.
    static void AddDialogueTables(AIControlTemplate& t, std::size_t cleanup);
};
