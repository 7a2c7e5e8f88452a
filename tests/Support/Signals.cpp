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

std::vector<float> PinkNoise(std::size_t frames, std::uint32_t seed) {
    const std::vector<float> white = Noise(frames, 1.0, seed);
    const double poles[] = {0.99886, 0.99332, 0.96900, 0.86650, 0.55000};
    const double weights[] = {0.0555179, 0.0750759, 0.1538520, 0.3104856, 0.5329522};
    double state[5] = {};
    std::vector<float> pink(frames);
    for (std::size_t n = 0; n < frames; ++n) {
        double sum = 0.5362 * white[n];
        for (int k = 0; k < 5; ++k) sum += state[k] = poles[k] * state[k] + weights[k] * white[n];
        pink[n] = static_cast<float>(sum);
    }
    const float peak = Peak(pink);
    for (float& x : pink) x /= peak;
    return pink;
}

std::vector<float> Impulse(std::size_t frames, std::size_t at, float value) {
    std::vector<float> x(frames, 0.0f);
    if (at < frames) x[at] = value;
    return x;
}

std::vector<float> MusicLike(double sampleRate, std::size_t frames) {
    std::vector<float> x(frames, 0.0f);
    const std::vector<float> noise = Noise(frames, 1.0, 77);
    const double notes[] = {110.0, 164.8, 220.0, 277.2, 329.6, 440.0, 659.3, 880.0};
    const auto beat = static_cast<std::size_t>(sampleRate * 0.125);
    for (std::size_t n = 0; n < frames; ++n) {
        const double t = static_cast<double>(n) / sampleRate;
        const std::size_t bar = n / beat;
        const double local = static_cast<double>(n % beat) / sampleRate;
        const double f = notes[bar % 8];
        double v = 0.0;
        for (int h = 1; h <= 12; ++h) v += std::sin(2.0 * kPi * f * h * t + h) / h * std::exp(-local * (3.0 + h));
        v += 1.2 * std::sin(2.0 * kPi * (50.0 + 120.0 * std::exp(-local * 30.0)) * local) * std::exp(-local * 12.0);
        if (bar % 2 == 1) v += 0.6 * noise[n] * std::exp(-local * 60.0);
        v += 0.2 * std::sin(2.0 * kPi * 9000.0 * t) * (0.5 + 0.5 * std::sin(2.0 * kPi * 3.0 * t));
        x[n] = static_cast<float>(0.9 * v);
    }
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

std::vector<double> Envelope(const std::vector<float>& x, int smoothing) {
    std::vector<double> weights(static_cast<std::size_t>(2 * smoothing + 1));
    for (int j = -smoothing; j <= smoothing; ++j)
        weights[static_cast<std::size_t>(j + smoothing)] = 0.5 + 0.5 * std::cos(kPi * j / (smoothing + 1));
    const auto n = static_cast<std::ptrdiff_t>(x.size());
    std::vector<double> envelope(x.size(), 0.0);
    for (std::ptrdiff_t i = 0; i < n; ++i) {
        double sum = 0.0;
        for (std::ptrdiff_t j = std::max<std::ptrdiff_t>(-smoothing, -i); j <= smoothing && i + j < n; ++j)
            sum += weights[static_cast<std::size_t>(j + smoothing)] * x[i + j] * x[i + j];
        envelope[static_cast<std::size_t>(i)] = sum;
    }
    return envelope;
}

}  // namespace

double Amplitude(const std::vector<float>& x, double sampleRate, double frequency, std::size_t from, std::size_t to) {
    to = std::min(to, x.size());
    return 2.0 * std::abs(Component(x, sampleRate, frequency, from, to)) / static_cast<double>(to - from);
}

double EnvelopeLag(const std::vector<float>& reference, const std::vector<float>& test, int maxLag, int smoothing) {
    const std::vector<double> a = Envelope(reference, smoothing);
    const std::vector<double> b = Envelope(test, smoothing);
    const auto n = static_cast<std::ptrdiff_t>(std::min(a.size(), b.size()));
    std::vector<double> correlation(static_cast<std::size_t>(2 * maxLag + 1));
    for (int lag = -maxLag; lag <= maxLag; ++lag) {
        double sum = 0.0;
        for (std::ptrdiff_t i = std::max<std::ptrdiff_t>(0, -lag); i < n && i + lag < n; ++i) sum += a[i] * b[i + lag];
        correlation[static_cast<std::size_t>(lag + maxLag)] = sum;
    }
    const auto best = static_cast<std::size_t>(std::max_element(correlation.begin(), correlation.end()) - correlation.begin());
    if (best == 0 || best + 1 == correlation.size()) return static_cast<double>(best) - maxLag;
    const double left = correlation[best - 1], centre = correlation[best], right = correlation[best + 1];
    return static_cast<double>(best) - maxLag + 0.5 * (left - right) / (left - 2.0 * centre + right);
}

double MagnitudeDb(const std::vector<float>& impulseResponse, double frequency, double sampleRate) {
    const std::complex<double> step = std::polar(1.0, -2.0 * kPi * frequency / sampleRate);
    std::complex<double> turn = 1.0, sum = 0.0;
    for (std::size_t n = 0; n < impulseResponse.size(); ++n) {
        sum += static_cast<double>(impulseResponse[n]) * turn;
        turn *= step;
        if (n % 1024 == 1023) turn /= std::abs(turn);  // keeps the rotation on the unit circle
    }
    return 20.0 * std::log10(std::abs(sum));
}

}  // namespace zentest
