#include "AI_Dialog.h"

AI_Dialog::AI_Dialog(AITemplateOwner& owner)
    : AIControlTemplate(owner, "AI_Dialog",
                        {"LEVELLING_MODE", "CLEANUP", "CLEANUP_AMOUNT", "ENHANCE", "ENHANCE_AMOUNT", "BAL_LEVEL"}) {
    AddDialogueTables(*this, kCleanup);
}

void AI_Dialog::AddDialogueTables(AIControlTemplate& t, std::size_t cleanup) {
    const char* dp = kDialogueProcessor;
    for (const char* stage : {"Rumble Filt", "De-Pop", "De-Ess", "Compressor", "Expander", "Exciter"})
        t.AddDefault(dp, stage, 0.0f);
    t.AddDefault(dp, "De-Pop Amount", 0.15f);
    t.AddDefault(dp, "De-Ess Amount", 0.05f);
    t.AddDefault(dp, "Exp Amount", 0.0f);
    t.AddDefault(dp, "Exp Speed", 1000.0f);

    const std::size_t amount = cleanup + 1, enhance = cleanup + 2, enhanceAmount = cleanup + 3;
    for (const char* stage : {"Rumble Filt", "De-Pop", "De-Ess", "Expander"}) t.AddMapping(cleanup, dp, stage, 1.0f, 0.0f);
    t.AddMapping(amount, dp, "De-Pop Amount", 0.7f, 0.15f);
    t.AddMapping(amount, dp, "De-Ess Amount", 0.6f, 0.05f);
    t.AddMapping(amount, dp, "Exp Amount", 0.55f, 0.0f);
    t.AddMapping(enhance, dp, "Compressor", 1.0f, 0.0f);
    t.AddMapping(enhance, dp, "Exciter", 1.0f, 0.0f);
    t.AddMapping(enhanceAmount, dp, "Comp Amount", 0.5f, 0.0f);
}
