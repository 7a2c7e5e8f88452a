#include "Support/Signals.h"

#include <algorithm>
#include <cmath>
#include <complex>

namespace zentest {

std::vector<float> Sine(double frequency, double sampleRate, std::size_t frames, double amplitude, double phase) {
    std::vector<float> x(frames);
    for (std::size_t n = 0; n < frames; ++n)
        x[n] = static_cast<float>(amplitude * std::sin(2.0 * kPi * frequency * static_cast<double>(n) / sampleRate + phase));
    return x;
}

std::vector<float> Noise(std::size_t frames, double amplitude, std::uint32_t seed) {
    std::vector<float> x(frames);
    std::uint32_t state = seed * 2654435761u + 1u;
    for (float& v : x) {
        state = state * 1664525u + 1013904223u;
        v = static_cast<float>(amplitude * (static_cast<double>(state) / 2147483648.0 - 1.0));
    }
    return x;
}

std::vector<float> Impulse(std::size_t frames, std::size_t at, float value) {
    std::vector<float> x(frames, 0.0f);
    if (at < frames) x[at] = value;
    return x;
}

float Peak(const std::vector<float>& x, std::size_t from, std::size_t to) {
    float peak = 0.0f;
    for (std::size_t n = from; n < std::min(to, x.size()); ++n) peak = std::max(peak, std::fabs(x[n]));
    return peak;
}

double Rms(const std::vector<float>& x, std::size_t from, std::size_t to) {
    to = std::min(to, x.size());
    if (to <= from) return 0.0;
    double sum = 0.0;
    for (std::size_t n = from; n < to; ++n) sum += static_cast<double>(x[n]) * x[n];
    return std::sqrt(sum / static_cast<double>(to - from));
}

double ToDb(double gain) { return 20.0 * std::log10(std::max(gain, 1e-30)); }

float LargestStep(const std::vector<float>& x) {
    float step = 0.0f;
    for (std::size_t n = 1; n < x.size(); ++n) step = std::max(step, std::fabs(x[n] - x[n - 1]));
    return step;
}

std::size_t ArgPeak(const std::vector<float>& x) {
    std::size_t best = 0;
    for (std::size_t n = 1; n < x.size(); ++n)
        if (std::fabs(x[n]) > std::fabs(x[best])) best = n;
    return best;
}

namespace {

std::complex<double> Component(const std::vector<float>& x, double sampleRate, double frequency, std::size_t from,
                               std::size_t to) {
    std::complex<double> sum = 0.0;
    const double w = 2.0 * kPi * frequency / sampleRate;
    for (std::size_t n = from; n < std::min(to, x.size()); ++n)
        sum += static_cast<double>(x[n]) * std::polar(1.0, -w * static_cast<double>(n));
    return sum;
}

}  // namespace

double ResponseDb(const std::vector<float>& x, double sampleRate, double frequency) {
    return ToDb(std::abs(Component(x, sampleRate, frequency, 0, x.size())));
}

double Amplitude(const std::vector<float>& x, double sampleRate, double frequency, std::size_t from, std::size_t to) {
    to = std::min(to, x.size());
    return 2.0 * std::abs(Component(x, sampleRate, frequency, from, to)) / static_cast<double>(to - from);
}

}  // namespace zentest
