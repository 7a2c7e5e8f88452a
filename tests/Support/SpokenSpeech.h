// Real speech for tests, spoken by espeak-ng (a Debian package that
// scripts/install-deps.sh installs) and resampled to the rate a test needs;
// and the noises speech is mixed with in noise-reduction tests.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace zentest {

// The sentence at `sampleRate`, peak normalised to -6 dBFS; empty when
// espeak-ng cannot be run (the test then reports why).
std::vector<float> Speak(const std::string& text, double sampleRate, int wordsPerMinute = 160);

// Phrases separated by `gapSeconds` of silence, with silence before and after.
std::vector<float> SpeakPhrases(const std::vector<std::string>& phrases, double sampleRate, double gapSeconds);

enum class NoiseKind { White, Pink, Babble, Hum };
const char* NoiseName(NoiseKind kind);
// Stationary (white, pink, hum: mains at 50 Hz with harmonics over a little
// pink noise) or speech-shaped and amplitude-modulated like a distant crowd
// (babble), unit RMS, reproducible by seed.
std::vector<float> MakeNoise(NoiseKind kind, std::size_t frames, double sampleRate, std::uint32_t seed = 3);

// `speech + gain * noise` where the gain sets the ratio of the speech's
// active-level power (frames within 40 dB of its loudest) to the noise's power.
std::vector<float> MixAtSnr(const std::vector<float>& speech, const std::vector<float>& noise, double snrDb);

}  // namespace zentest
