// Dialogue as a location recording brings it: phrases of speech-like
// material (Speech.h) over room noise and low rumble, each phrase opened by
// a plosive pop, with pauses between phrases. The regions of each kind are
// kept, and the clean parts alone, for measurements.
#pragma once

#include <vector>

#include "Support/Speech.h"

namespace zentest {

struct NoisyDialogue {
    std::vector<float> samples;
    std::vector<Region> vowels;     // of the speech
    std::vector<Region> sibilants;
    std::vector<Region> pops;       // each pop up to the first vowel of its phrase
    std::vector<Region> gaps;       // room noise and rumble alone, after each phrase
    std::vector<Region> popFree;    // vowels that no pop reaches
};

// Rumble: 25, 35 and 45 Hz at -30 dBFS RMS together. Room noise: white at
// -60 dBFS RMS. Pops: an 80 Hz thump of 0.8 decaying over 15 ms, 30 ms
// before the phrase's first vowel. Phrases of three syllables, 2 s apart.
constexpr double kRumbleRmsDb = -30.0;
constexpr double kRoomNoiseRmsDb = -60.0;
constexpr double kPhraseGapSeconds = 2.0;

NoisyDialogue MakeNoisyDialogue(double sampleRate, int phrases = 3, unsigned seed = 11);

}  // namespace zentest
