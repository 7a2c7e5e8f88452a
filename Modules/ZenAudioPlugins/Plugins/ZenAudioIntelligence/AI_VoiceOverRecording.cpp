#include "AI_VoiceOverRecording.h"

#include "AI_Dialog.h"

AI_VoiceOverRecording::AI_VoiceOverRecording(AITemplateOwner& owner)
    : AIControlTemplate(owner, "AI_VoiceOverRecording",
                        {"LEVELLING_MODE", "CLEANUP", "CLEANUP_AMOUNT", "ENHANCE", "ENHANCE_AMOUNT"}) {
    AI_Dialog::AddDialogueTables(*this, kCleanup);
    AddDefault(kDialogueProcessor, "Exp Speed", 300.0f);
    AddDefault(kDialogueProcessor, "Exp Threshold", -50.0f);
}
