#include "AI_SFX.h"

AI_SFX::AI_SFX(AITemplateOwner& owner)
    : AIControlTemplate(owner, "AI_SFX", {"CRUNCH_ON", "CRUNCH_AMOUNT", "REVERB_ON", "REVERB_SIZE", "REVERB_AMOUNT"}) {
    AddMapping(kCrunch, kDistortion, kInternalBypass, -1000.0f, 1000.0f);
    AddMapping(kCrunchAmount, kDistortion, "Ceiling", -1.0f, 1000.0f);
    AddMapping(kCrunchAmount, kDistortion, "Output Level", 0.5f, 500.0f);
    AddReverbTables(*this, kReverbOn);
}

void AI_SFX::AddReverbTables(AIControlTemplate& t, std::size_t on) {
    const char* r = kReverb;
    t.AddDefault(r, "T@-60dB", 418.0f);
    t.AddDefault(r, "Early Refl. Gain", 900.0f);
    t.AddDefault(r, "Late Rev. Gain", 850.0f);
    t.AddDefault(r, "Room Length", 449.0f);
    t.AddDefault(r, "Room Width", 399.0f);
    t.AddDefault(r, "Dry/Wet", 245.0f);

    const std::size_t size = on + 1, amount = on + 2;
    t.AddMapping(on, r, kInternalBypass, -1000.0f, 1000.0f);
    t.AddMapping(size, r, "T@-60dB", 0.8f, 100.0f);
    t.AddMapping(size, r, "Early Refl. Gain", -0.25f, 1000.0f);
    t.AddMapping(size, r, "Late Rev. Gain", 0.25f, 750.0f);
    t.AddMapping(size, r, "Room Length", 0.75f, 150.0f);
    t.AddMapping(size, r, "Room Width", 0.55f, 180.0f);
    t.AddMapping(amount, r, "Dry/Wet", 1.0f, 0.0f);
}
