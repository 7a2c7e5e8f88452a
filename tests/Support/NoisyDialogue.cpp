#include "Support/NoisyDialogue.h"

#include <cmath>
#include <iterator>

#include "Support/Signals.h"

namespace zentest {

namespace {

constexpr double kRumbleHz[] = {25.0, 35.0, 45.0};
constexpr double kRumbleShare[] = {0.6, 0.5, 0.4};  // amplitudes before scaling to the RMS
constexpr double kPopHz = 80.0, kPopPeak = 0.8, kPopDecaySeconds = 0.015, kPopLeadSeconds = 0.03;
constexpr double kPopReachSeconds = 0.15;  // the thump is 80 dB down by then
constexpr int kSyllables = 3;

double DbToAmplitude(double db) { return std::pow(10.0, db / 20.0); }

}  // namespace

NoisyDialogue MakeNoisyDialogue(double sampleRate, int phrases, unsigned seed) {
    const auto gap = static_cast<std::size_t>(kPhraseGapSeconds * sampleRate);
    const auto popLead = static_cast<std::size_t>(kPopLeadSeconds * sampleRate);
    NoisyDialogue d;
    // A pause before the first phrase too, so every phrase has one before it.
    std::vector<double> x(gap, 0.0);
    for (int p = 0; p < phrases; ++p) {
        const SpeechLike speech = MakeSpeechLike(sampleRate, kSyllables, seed + static_cast<unsigned>(p));
        const std::size_t pop = x.size(), start = pop + popLead;
        x.resize(start + speech.samples.size() + gap, 0.0);
        for (std::size_t n = 0; n < speech.samples.size(); ++n) x[start + n] += speech.samples[n];
        for (std::size_t n = 0; pop + n < x.size(); ++n) {
            const double t = static_cast<double>(n) / sampleRate;
            if (t > kPopReachSeconds) break;
            x[pop + n] += kPopPeak * std::exp(-t / kPopDecaySeconds) * std::sin(2.0 * kPi * kPopHz * t);
        }
        const std::size_t firstVowel = start + speech.vowels.front().first;
        d.pops.push_back({pop, firstVowel});
        for (const Region& v : speech.vowels) {
            d.vowels.push_back({start + v.first, start + v.second});
            if (start + v.first >= pop + static_cast<std::size_t>(kPopReachSeconds * sampleRate))
                d.popFree.push_back(d.vowels.back());
        }
        for (const Region& s : speech.sibilants) d.sibilants.push_back({start + s.first, start + s.second});
        d.gaps.push_back({start + speech.samples.size(), x.size()});
    }

    double rumbleScale = 0.0;
    for (double share : kRumbleShare) rumbleScale += share * share / 2.0;
    rumbleScale = DbToAmplitude(kRumbleRmsDb) / std::sqrt(rumbleScale);
    // Uniform noise has an RMS of its amplitude over sqrt(3).
    const std::vector<float> room = Noise(x.size(), DbToAmplitude(kRoomNoiseRmsDb) * std::sqrt(3.0), seed);
    d.samples.resize(x.size());
    for (std::size_t n = 0; n < x.size(); ++n) {
        const double t = static_cast<double>(n) / sampleRate;
        double rumble = 0.0;
        for (std::size_t k = 0; k < std::size(kRumbleHz); ++k)
            rumble += kRumbleShare[k] * std::sin(2.0 * kPi * kRumbleHz[k] * t + static_cast<double>(k));
        d.samples[n] = static_cast<float>(x[n] + rumbleScale * rumble + room[n]);
    }
    return d;
}

}  // namespace zentest
