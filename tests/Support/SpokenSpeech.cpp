#include "Support/SpokenSpeech.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <numeric>
#include <random>

#include "Support/Signals.h"

namespace zentest {

namespace {

constexpr double kPeak = 0.5;  // -6 dBFS

// Samples of a 16-bit mono WAV stream, read to its end (espeak-ng writes
// placeholder chunk sizes when it writes to a pipe).
std::vector<float> ReadWav(FILE* in, double& rate) {
    std::vector<float> samples;
    unsigned char header[12];
    if (std::fread(header, 1, 12, in) != 12 || std::memcmp(header, "RIFF", 4) != 0) return samples;
    unsigned char chunk[8];
    while (std::fread(chunk, 1, 8, in) == 8) {
        const std::uint32_t size = chunk[4] | chunk[5] << 8 | chunk[6] << 16 | static_cast<std::uint32_t>(chunk[7]) << 24;
        if (std::memcmp(chunk, "fmt ", 4) == 0) {
            std::vector<unsigned char> fmt(size);
            if (std::fread(fmt.data(), 1, size, in) != size || size < 16) return samples;
            rate = fmt[4] | fmt[5] << 8 | fmt[6] << 16 | fmt[7] << 24;
        } else if (std::memcmp(chunk, "data", 4) == 0) {
            unsigned char pair[2];
            while (std::fread(pair, 1, 2, in) == 2)
                samples.push_back(static_cast<float>(static_cast<std::int16_t>(pair[0] | pair[1] << 8)) / 32768.0f);
            return samples;
        } else {
            for (std::uint32_t i = 0; i < size; ++i) std::fgetc(in);
        }
    }
    return samples;
}

// Windowed-sinc resampling (Blackman, 32 zero crossings, cut-off below the
// lower Nyquist rate). The rates are whole numbers of Hz, so output sample n
// falls on one of `up` phases between input samples: the taps of each phase
// are computed once.
std::vector<float> Resample(const std::vector<float>& x, double from, double to) {
    if (from == to || x.empty()) return x;
    const auto gcd = std::gcd(static_cast<long>(from), static_cast<long>(to));
    const long up = static_cast<long>(to) / gcd, down = static_cast<long>(from) / gcd;
    const double cutoff = 0.95 * std::min(1.0, to / from);
    const int half = 32;
    const long reach = static_cast<long>(std::ceil(half / cutoff));
    const std::size_t taps = static_cast<std::size_t>(2 * reach + 1);
    std::vector<float> table(static_cast<std::size_t>(up) * taps);
    for (long phase = 0; phase < up; ++phase)
        for (long j = -reach; j <= reach; ++j) {
            // Output at input position centre + phase/up; tap on input centre + j.
            const double d = (static_cast<double>(phase) / static_cast<double>(up) - static_cast<double>(j)) * cutoff;
            double value = 0.0;
            if (std::fabs(d) < half) {
                const double sinc = d == 0.0 ? 1.0 : std::sin(kPi * d) / (kPi * d);
                const double w = 0.42 + 0.5 * std::cos(kPi * d / half) + 0.08 * std::cos(2 * kPi * d / half);
                value = sinc * w * cutoff;
            }
            table[static_cast<std::size_t>(phase) * taps + static_cast<std::size_t>(j + reach)] = static_cast<float>(value);
        }
    const auto frames = static_cast<std::size_t>(x.size() * static_cast<std::size_t>(up) / static_cast<std::size_t>(down));
    std::vector<float> y(frames);
    for (std::size_t n = 0; n < frames; ++n) {
        const long position = static_cast<long>(n) * down;
        const long centre = position / up, phase = position % up;
        const float* t = table.data() + static_cast<std::size_t>(phase) * taps;
        double sum = 0.0;
        for (long j = -reach; j <= reach; ++j) {
            const long k = centre + j;
            if (k >= 0 && k < static_cast<long>(x.size())) sum += x[static_cast<std::size_t>(k)] * t[j + reach];
        }
        y[n] = static_cast<float>(sum);
    }
    return y;
}

void Normalise(std::vector<float>& x, double peak) {
    const float largest = Peak(x);
    if (largest <= 0.0f) return;
    for (float& v : x) v = static_cast<float>(v * peak / largest);
}

// One-pole sections whose sum approximates a -3 dB/octave slope over the audio band.
struct PinkFilter {
    double b[7] = {};
    float operator()(double white) {
        b[0] = 0.99886 * b[0] + white * 0.0555179;
        b[1] = 0.99332 * b[1] + white * 0.0750759;
        b[2] = 0.96900 * b[2] + white * 0.1538520;
        b[3] = 0.86650 * b[3] + white * 0.3104856;
        b[4] = 0.55000 * b[4] + white * 0.5329522;
        b[5] = -0.7616 * b[5] - white * 0.0168980;
        const double pink = b[0] + b[1] + b[2] + b[3] + b[4] + b[5] + b[6] + white * 0.5362;
        b[6] = white * 0.115926;
        return static_cast<float>(pink);
    }
};

void NormaliseRms(std::vector<float>& x) {
    const double rms = Rms(x);
    if (rms > 0.0)
        for (float& v : x) v = static_cast<float>(v / rms);
}

}  // namespace

std::vector<float> Speak(const std::string& text, double sampleRate, int wordsPerMinute) {
    std::string quoted;
    for (char c : text)
        if (c != '"' && c != '\\' && c != '$' && c != '`') quoted += c;
    const std::string command = "espeak-ng --stdout -s " + std::to_string(wordsPerMinute) + " \"" + quoted + "\" 2>/dev/null";
    FILE* pipe = popen(command.c_str(), "r");
    if (pipe == nullptr) return {};
    double rate = 0.0;
    std::vector<float> samples = ReadWav(pipe, rate);
    pclose(pipe);
    if (samples.empty() || rate <= 0.0) return {};
    samples = Resample(samples, rate, sampleRate);
    Normalise(samples, kPeak);
    return samples;
}

std::vector<float> SpeakPhrases(const std::vector<std::string>& phrases, double sampleRate, double gapSeconds) {
    const auto gap = static_cast<std::size_t>(gapSeconds * sampleRate);
    std::vector<float> out(gap, 0.0f);
    for (const std::string& phrase : phrases) {
        const std::vector<float> spoken = Speak(phrase, sampleRate);
        if (spoken.empty()) return {};
        out.insert(out.end(), spoken.begin(), spoken.end());
        out.insert(out.end(), gap, 0.0f);
    }
    return out;
}

const char* NoiseName(NoiseKind kind) {
    switch (kind) {
        case NoiseKind::White: return "white";
        case NoiseKind::Pink: return "pink";
        case NoiseKind::Babble: return "babble";
        case NoiseKind::Hum: return "hum";
    }
    return "?";
}

std::vector<float> MakeNoise(NoiseKind kind, std::size_t frames, double sampleRate, std::uint32_t seed) {
    std::mt19937 random(seed);
    std::normal_distribution<double> gauss(0.0, 1.0);
    std::vector<float> x(frames);
    switch (kind) {
        case NoiseKind::White:
            for (float& v : x) v = static_cast<float>(gauss(random));
            break;
        case NoiseKind::Pink: {
            PinkFilter pink;
            for (float& v : x) v = pink(gauss(random));
            break;
        }
        case NoiseKind::Babble: {
            // Pink noise through a speech-band resonance, its level swinging
            // at syllable rates of several talkers.
            PinkFilter pink;
            const double w = 2 * kPi * 600.0 / sampleRate, r = 0.97;
            double y1 = 0.0, y2 = 0.0;
            const double rates[] = {3.1, 4.3, 5.7, 2.3};
            for (std::size_t n = 0; n < frames; ++n) {
                const double y = pink(gauss(random)) + 2 * r * std::cos(w) * y1 - r * r * y2;
                y2 = y1, y1 = y;
                const double t = static_cast<double>(n) / sampleRate;
                double envelope = 0.0;
                for (int i = 0; i < 4; ++i) envelope += 0.5 + 0.5 * std::sin(2 * kPi * rates[i] * t + i * 1.7);
                x[n] = static_cast<float>(y * envelope);
            }
            break;
        }
        case NoiseKind::Hum: {
            PinkFilter pink;
            for (std::size_t n = 0; n < frames; ++n) {
                const double t = static_cast<double>(n) / sampleRate;
                double hum = 0.0;
                for (int h = 1; h <= 9; ++h) hum += std::sin(2 * kPi * 50.0 * h * t + h) / h;
                x[n] = static_cast<float>(hum + 0.05 * pink(gauss(random)));
            }
            break;
        }
    }
    NormaliseRms(x);
    return x;
}

std::vector<float> MixAtSnr(const std::vector<float>& speech, const std::vector<float>& noise, double snrDb) {
    const std::size_t frame = 480;
    std::vector<double> powers;
    double loudest = 0.0;
    for (std::size_t i = 0; i + frame <= speech.size(); i += frame) {
        double p = 0.0;
        for (std::size_t j = i; j < i + frame; ++j) p += static_cast<double>(speech[j]) * speech[j];
        powers.push_back(p / frame);
        loudest = std::max(loudest, p / frame);
    }
    double active = 0.0;
    std::size_t count = 0;
    for (double p : powers)
        if (p > loudest * 1e-4) active += p, ++count;
    const double speechPower = count > 0 ? active / static_cast<double>(count) : 0.0;
    double noisePower = 0.0;
    const std::size_t n = std::min(speech.size(), noise.size());
    for (std::size_t i = 0; i < n; ++i) noisePower += static_cast<double>(noise[i]) * noise[i];
    noisePower /= static_cast<double>(std::max<std::size_t>(n, 1));
    const double gain = noisePower > 0.0 ? std::sqrt(speechPower / noisePower / std::pow(10.0, snrDb / 10.0)) : 0.0;
    std::vector<float> out(n);
    for (std::size_t i = 0; i < n; ++i) out[i] = static_cast<float>(speech[i] + gain * noise[i]);
    return out;
}

}  // namespace zentest
