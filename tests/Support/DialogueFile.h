// Dialogue for the levelling figures: espeak-ng phrases, each at its own
// loudness from -38 to -14 LUFS, 2.4 s apart after 1 s of silence, with a
// music bed 18 LU or more under phrases 4 to 7 (from the start of the 4th
// to the middle of the pause after the 7th, so it fills their pauses). Adjacent
// phrases differ by at most 8 dB, so a gain moving 1 dB per 0.4 s reaches
// each phrase across the pause before it. Mono, 48 kHz, about 65 s.
#pragma once

#include <cstddef>
#include <vector>

namespace zentest {

struct DialogueFile {
    struct Phrase {
        std::size_t begin = 0;  // first and one past the last audible sample
        std::size_t end = 0;
        double loudness = 0.0;  // LUFS, integrated over the phrase alone
    };
    std::vector<float> samples;
    std::vector<Phrase> phrases;
};

constexpr double kDialogueRate = 48000.0;
constexpr double kMusicBedLufs = -50.0;

// Empty when espeak-ng cannot be run.
DialogueFile MakeLevelledDialogueTestFile();

// Integrated loudness (BS.1770, gated) of `x`, LUFS.
double IntegratedLoudness(const std::vector<float>& x);

}  // namespace zentest
