#include "Support/Speech.h"

#include <algorithm>
#include <cmath>
#include <complex>

#include "Support/Signals.h"

namespace zentest {

namespace {

// A plain second-order section (RBJ designs), so the material does not
// depend on the filters under test.
struct Section {
    double b0, b1, b2, a1, a2, x1 = 0, x2 = 0, y1 = 0, y2 = 0;
    Section(bool highPass, double f, double q, double fs) {
        const double w = 2 * kPi * f / fs, alpha = std::sin(w) / (2 * q), a0 = 1 + alpha, c = std::cos(w);
        b0 = highPass ? (1 + c) / 2 / a0 : alpha / a0;  // band-pass: unity peak gain
        b1 = highPass ? -(1 + c) / a0 : 0.0;
        b2 = highPass ? b0 : -b0;
        a1 = -2 * c / a0;
        a2 = (1 - alpha) / a0;
    }
    double operator()(double x) {
        const double y = b0 * x + b1 * x1 + b2 * x2 - a1 * y1 - a2 * y2;
        x2 = x1, x1 = x, y2 = y1, y1 = y;
        return y;
    }
};

constexpr double kFormants[][3] = {{730, 1090, 2440}, {270, 2290, 3010}, {530, 1840, 2480}, {570, 840, 2410}};
constexpr double kVowelSeconds = 0.22, kSibilantSeconds = 0.12, kPauseSeconds = 0.06;
constexpr double kVowelPeak = 0.5, kSibilantPeak = 0.3;

void Normalise(std::vector<double>& x, double peak) {
    double largest = 0;
    for (double v : x) largest = std::max(largest, std::fabs(v));
    for (double& v : x) v *= peak / largest;
}

// Radix-2 FFT in place.
void Fft(std::vector<std::complex<double>>& x) {
    const std::size_t n = x.size();
    for (std::size_t i = 1, j = 0; i < n; ++i) {
        std::size_t bit = n >> 1;
        for (; j & bit; bit >>= 1) j ^= bit;
        if (i < (j ^= bit)) std::swap(x[i], x[j]);
    }
    for (std::size_t len = 2; len <= n; len <<= 1) {
        const std::complex<double> step = std::polar(1.0, -2 * kPi / static_cast<double>(len));
        for (std::size_t i = 0; i < n; i += len) {
            std::complex<double> w = 1;
            for (std::size_t k = i; k < i + len / 2; ++k, w *= step) {
                const std::complex<double> a = x[k], b = x[k + len / 2] * w;
                x[k] = a + b;
                x[k + len / 2] = a - b;
            }
        }
    }
}

}  // namespace

SpeechLike MakeSpeechLike(double sampleRate, int syllables, unsigned seed) {
    const auto vowelLength = static_cast<std::size_t>(kVowelSeconds * sampleRate);
    const auto sibilantLength = static_cast<std::size_t>(kSibilantSeconds * sampleRate);
    const auto pause = static_cast<std::size_t>(kPauseSeconds * sampleRate);
    const std::vector<float> noise = Noise(sibilantLength * static_cast<std::size_t>(syllables), 1.0, seed);
    SpeechLike speech;
    std::vector<double> voice, hiss;
    double phase = 0;
    for (int s = 0; s < syllables; ++s) {
        // Glottal pulses gliding from 140 to 110 Hz through three formants.
        const double* f = kFormants[s % 4];
        Section f1(false, f[0], 5, sampleRate), f2(false, f[1], 8, sampleRate), f3(false, f[2], 10, sampleRate);
        const std::size_t start = voice.size();
        for (std::size_t n = 0; n < vowelLength; ++n) {
            const double t = static_cast<double>(n) / sampleRate;
            phase += (140.0 - 30.0 * t / kVowelSeconds) / sampleRate;
            const double pulse = phase >= 1 ? 1.0 : 0.0;
            phase -= pulse;
            const double ramp = std::min({1.0, t / 0.02, (kVowelSeconds - t) / 0.02});
            voice.push_back(ramp * (f1(pulse) + 0.5 * f2(pulse) + 0.25 * f3(pulse)));
        }
        speech.vowels.push_back({start, voice.size()});
        voice.resize(voice.size() + pause, 0.0);

        // "s": noise from 4 kHz up with its weight around 6.5 kHz, swelling and fading.
        Section high(true, 4000, 0.707, sampleRate), body(false, 6500, 1.2, sampleRate);
        const std::size_t burst = voice.size();
        voice.resize(burst + sibilantLength + pause, 0.0);
        hiss.resize(voice.size(), 0.0);
        for (std::size_t n = 0; n < sibilantLength; ++n) {
            const double x = noise[static_cast<std::size_t>(s) * sibilantLength + n];
            hiss[burst + n] = std::sin(kPi * static_cast<double>(n) / sibilantLength) * (0.4 * high(x) + body(x));
        }
        speech.sibilants.push_back({burst, burst + sibilantLength});
    }
    Normalise(voice, kVowelPeak);
    Normalise(hiss, kSibilantPeak);
    for (std::size_t n = 0; n < voice.size(); ++n) speech.samples.push_back(static_cast<float>(voice[n] + hiss[n]));
    return speech;
}

double BandEnergy(const std::vector<float>& x, double sampleRate, double low, double high,
                  const std::vector<Region>& regions, std::size_t frame) {
    const auto first = static_cast<std::size_t>(std::ceil(low * frame / sampleRate));
    const auto last = std::min(frame / 2, static_cast<std::size_t>(std::floor(high * frame / sampleRate)));
    double energy = 0;
    std::vector<std::complex<double>> bins(frame);
    for (const Region& region : regions)
        for (std::size_t start = region.first; start + frame <= std::min(region.second, x.size()); start += frame / 2) {
            for (std::size_t n = 0; n < frame; ++n)
                bins[n] = (0.5 - 0.5 * std::cos(2 * kPi * static_cast<double>(n) / frame)) * x[start + n];
            Fft(bins);
            for (std::size_t k = first; k <= last; ++k) energy += std::norm(bins[k]);
        }
    return energy;
}

}  // namespace zentest
