#include "DemoMaterial.h"

#include <sndfile.h>

#include <algorithm>
#include <cmath>
#include <cstring>

namespace zenfx {

namespace {

constexpr double kPi = 3.141592653589793;
constexpr double kTwoPi = 2.0 * kPi;
constexpr double kFs = DemoMaterial::kSampleRate;

// Deterministic noise, so every run gives the same material.
class Noise {
public:
    double Next() {
        m_state = m_state * 6364136223846793005ULL + 1442695040888963407ULL;
        return static_cast<double>(m_state >> 11) * (2.0 / 9007199254740992.0) - 1.0;
    }

private:
    std::uint64_t m_state = 0x2545F4914F6CDD1DULL;
};

// Two-pole resonator (constant peak gain), for formants and drum tones.
class Resonator {
public:
    void Set(double frequency, double bandwidth) {
        const double r = std::exp(-kPi * bandwidth / kFs);
        m_a1 = 2.0 * r * std::cos(kTwoPi * frequency / kFs);
        m_a2 = -r * r;
        m_gain = 1.0 - r;
    }
    double Process(double x) {
        const double y = m_gain * x + m_a1 * m_y1 + m_a2 * m_y2;
        m_y2 = m_y1;
        m_y1 = y;
        return y;
    }

private:
    double m_a1 = 0.0, m_a2 = 0.0, m_gain = 0.0, m_y1 = 0.0, m_y2 = 0.0;
};

// One-pole high-pass, for sibilants and cymbals.
class HighPass {
public:
    explicit HighPass(double frequency) : m_a(std::exp(-kTwoPi * frequency / kFs)) {}
    double Process(double x) {
        m_low = (1.0 - m_a) * x + m_a * m_low;
        return x - m_low;
    }

private:
    double m_a;
    double m_low = 0.0;
};

struct Vowel {
    double f1, f2, f3;
};

// /a/, /i/, /u/, /e/, /o/
constexpr Vowel kVowels[] = {{730, 1090, 2440}, {270, 2290, 3010}, {300, 870, 2240}, {530, 1840, 2480},
                             {570, 840, 2410}};

// Scales a component so that its peak is `peak`.
void Normalise(std::vector<double>& x, double peak) {
    double largest = 0.0;
    for (double v : x) largest = std::max(largest, std::fabs(v));
    if (largest > 0.0)
        for (double& v : x) v *= peak / largest;
}

struct Mix {
    std::vector<double> left, right;
    explicit Mix(std::size_t frames) : left(frames, 0.0), right(frames, 0.0) {}
    // Adds a component at a peak level, panned 0 (left) .. 1 (right).
    void Add(std::vector<double> component, double peak, double pan = 0.5) {
        Normalise(component, peak);
        const double l = std::sqrt(1.0 - pan), r = std::sqrt(pan);
        for (std::size_t n = 0; n < component.size(); ++n) {
            left[n] += l * component[n];
            right[n] += r * component[n];
        }
    }
};

// Voiced syllables with gliding formants and falling intonation; every third
// syllable ends in a sibilant, every fourth starts with a plosive.
void MakeSpeech(Mix& mix, std::size_t frames) {
    Noise noise;
    Resonator f1, f2, f3;
    HighPass sibilance(4500.0);
    Resonator plosive;
    plosive.Set(90.0, 60.0);
    std::vector<double> voice(frames), fricative(frames), pop(frames);
    double phase = 0.0;
    const double syllableSeconds = 0.25;
    for (std::size_t n = 0; n < frames; ++n) {
        const double t = static_cast<double>(n) / kFs;
        const auto syllable = static_cast<std::size_t>(t / syllableSeconds);
        const double within = std::fmod(t, syllableSeconds) / syllableSeconds;  // 0..1
        const Vowel& a = kVowels[syllable % 5];
        const Vowel& b = kVowels[(syllable + 1) % 5];
        const double glide = std::min(1.0, std::max(0.0, (within - 0.6) / 0.4));
        f1.Set(a.f1 + (b.f1 - a.f1) * glide, 90.0);
        f2.Set(a.f2 + (b.f2 - a.f2) * glide, 110.0);
        f3.Set(a.f3 + (b.f3 - a.f3) * glide, 170.0);

        const double phrase = std::fmod(t, 8 * syllableSeconds) / (8 * syllableSeconds);
        const double f0 = 150.0 - 40.0 * phrase + 8.0 * std::sin(kTwoPi * 3.0 * t);
        phase += f0 / kFs;
        double pulse = 0.0;
        if (phase >= 1.0) {
            phase -= 1.0;
            pulse = 1.0;
        }
        const double voiced = within < 0.15 ? within / 0.15 : (within > 0.7 ? std::max(0.0, (0.85 - within) / 0.15) : 1.0);
        const double source = pulse + 0.002 * noise.Next();
        voice[n] = (f1.Process(source) + 0.6 * f2.Process(source) + 0.3 * f3.Process(source)) * voiced;

        const double hiss = sibilance.Process(noise.Next());
        if (syllable % 3 == 2 && within > 0.7) fricative[n] = std::sin(kPi * (within - 0.7) / 0.3) * hiss;
        pop[n] = plosive.Process(syllable % 4 == 1 && within < 0.01 ? 1.0 : 0.0);
    }
    mix.Add(std::move(voice), 0.55);
    mix.Add(std::move(fricative), 0.3);
    mix.Add(std::move(pop), 0.35);
}

// A minor chord with bass, kick, snare and hi-hat at 120 BPM.
void MakeMusic(Mix& mix, std::size_t frames) {
    Noise noise;
    HighPass hat(7000.0);
    Resonator snareBody;
    snareBody.Set(190.0, 80.0);
    const double beat = 0.5;
    const double chord[] = {220.0, 261.63, 329.63, 440.0};
    const double bass = 110.0;
    std::vector<double> padLeft(frames), padRight(frames), bassLine(frames), kick(frames), snare(frames), hiHat(frames);
    double kickPhase = 0.0;
    for (std::size_t n = 0; n < frames; ++n) {
        const double t = static_cast<double>(n) / kFs;
        const double inBeat = std::fmod(t, beat);
        const auto beatIndex = static_cast<std::size_t>(t / beat);

        const double swell = std::min(1.0, t / 0.3);
        for (std::size_t k = 0; k < 4; ++k) {
            double note = 0.0;
            for (int h = 1; h <= 10; ++h) note += std::sin(kTwoPi * chord[k] * h * t) / (h * h);
            const double pan = static_cast<double>(k) / 3.0;
            padLeft[n] += note * (1.0 - pan) * swell;
            padRight[n] += note * pan * swell;
        }
        bassLine[n] = std::exp(-inBeat * 4.0) * (std::sin(kTwoPi * bass * t) + 0.3 * std::sin(kTwoPi * 2 * bass * t));

        const double kickFrequency = 50.0 + 90.0 * std::exp(-inBeat * 30.0);
        kickPhase += kickFrequency / kFs;
        kick[n] = std::exp(-inBeat * 12.0) * std::sin(kTwoPi * kickPhase);

        const double body = snareBody.Process(beatIndex % 2 == 1 && n > 0 && inBeat < 1.0 / kFs ? 1.0 : 0.0);
        if (beatIndex % 2 == 1) snare[n] = std::exp(-inBeat * 25.0) * (noise.Next() + 40.0 * body);

        const double inHalf = std::fmod(t, beat / 2.0);
        hiHat[n] = std::exp(-inHalf * 60.0) * hat.Process(noise.Next());
    }
    Normalise(padLeft, 1.0);
    Normalise(padRight, 1.0);
    mix.Add(std::move(padLeft), 0.22, 0.0);
    mix.Add(std::move(padRight), 0.22, 1.0);
    mix.Add(std::move(bassLine), 0.3);
    mix.Add(std::move(kick), 0.5);
    mix.Add(std::move(snare), 0.3, 0.45);
    mix.Add(std::move(hiHat), 0.1, 0.7);
}

}  // namespace

DemoMaterial::DemoMaterial() {
    const auto speechFrames = static_cast<std::size_t>(kSpeechSeconds * kSampleRate);
    const auto musicFrames = static_cast<std::size_t>(kMusicSeconds * kSampleRate);
    Mix speech(speechFrames), music(musicFrames);
    MakeSpeech(speech, speechFrames);
    MakeMusic(music, musicFrames);
    // Peaks at -3 dBFS, so processing has headroom to work with.
    double peak = 0.0;
    for (const Mix* part : {&speech, &music})
        for (std::size_t n = 0; n < part->left.size(); ++n)
            peak = std::max({peak, std::fabs(part->left[n]), std::fabs(part->right[n])});
    const double scale = peak > 0.0 ? 0.7079458 / peak : 1.0;
    m_samples.reserve((speechFrames + musicFrames) * kChannels);
    for (const Mix* part : {&speech, &music}) {
        for (std::size_t n = 0; n < part->left.size(); ++n) {
            m_samples.push_back(static_cast<float>(part->left[n] * scale));
            m_samples.push_back(static_cast<float>(part->right[n] * scale));
        }
    }
}

int DemoMaterial::Format() const { return SF_FORMAT_WAV | SF_FORMAT_FLOAT; }

std::int64_t DemoMaterial::Read(float* interleaved, std::int64_t frames) {
    const std::size_t available = (m_samples.size() - m_position) / kChannels;
    const std::size_t count = std::min<std::size_t>(available, static_cast<std::size_t>(frames));
    std::memcpy(interleaved, m_samples.data() + m_position, count * kChannels * sizeof(float));
    m_position += count * kChannels;
    return static_cast<std::int64_t>(count);
}

}  // namespace zenfx
