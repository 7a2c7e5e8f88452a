// Speech-like test material: voiced syllables (formant-filtered glottal
// pulses) alternating with sibilant bursts (shaped noise from 4 kHz up), with
// the regions of each kind, and band energies measured on it.
#pragma once

#include <cstddef>
#include <utility>
#include <vector>

namespace zentest {

using Region = std::pair<std::size_t, std::size_t>;  // [first, last)

struct SpeechLike {
    std::vector<float> samples;
    std::vector<Region> vowels;
    std::vector<Region> sibilants;
};

// `syllables` pairs of a vowel (220 ms) and a sibilant (120 ms), each
// followed by a short pause; reproducible by seed.
SpeechLike MakeSpeechLike(double sampleRate, int syllables = 6, unsigned seed = 7);

// Energy between `low` and `high` Hz inside the regions, from Hann-windowed
// frames of `frame` samples (a power of two) with half overlap (frames
// straddling a region's end are left out).
double BandEnergy(const std::vector<float>& x, double sampleRate, double low, double high,
                  const std::vector<Region>& regions, std::size_t frame = 1024);

}  // namespace zentest
