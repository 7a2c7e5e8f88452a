#include "AITemplateFactory.h"

#include "AI_Ambience.h"
#include "AI_Dialog.h"
#include "AI_DialogAdvanced.h"
#include "AI_DialogRider.h"
#include "AI_LevelRider.h"
#include "AI_Leveller.h"
#include "AI_Master.h"
#include "AI_Music.h"
#include "AI_SFX.h"
#include "AI_VoiceOverRecording.h"

namespace ai_templates {

std::unique_ptr<AIControlTemplate> Make(int number, AITemplateOwner& owner) {
    switch (number) {
        case 0: return std::make_unique<AI_Dialog>(owner);
        case 1: return std::make_unique<AI_Music>(owner);
        case 2: return std::make_unique<AI_SFX>(owner);
        case 3: return std::make_unique<AI_Ambience>(owner);
        case 4: return std::make_unique<AI_VoiceOverRecording>(owner);
        case 5: return std::make_unique<AI_DialogAdvanced>(owner);
        case 6: return std::make_unique<AI_LevelRider>(owner);
        case 7: return std::make_unique<AI_Leveller>(owner);
        case 8: return std::make_unique<AI_Master>(owner);
        case 9: return std::make_unique<AI_DialogRider>(owner);
        default: return nullptr;
    }
}

}  // namespace ai_templates
