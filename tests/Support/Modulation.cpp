#include "Modulation.h"

#include <algorithm>
#include <cmath>
#include <cstdint>

#include "Signals.h"

namespace zentest {

std::complex<double> Tone(const std::vector<float>& x, double frequency, double sampleRate, std::size_t from,
                          std::size_t count) {
    std::complex<double> sum = 0.0;
    const double w = 2.0 * kPi * frequency / sampleRate;
    for (std::size_t n = 0; n < count; ++n)
        sum += static_cast<double>(x[from + n]) * std::polar(1.0, -w * static_cast<double>(n));
    return 2.0 * sum / static_cast<double>(count);
}

double ThdNDb(const std::vector<float>& x, double frequency, double sampleRate, std::size_t from, std::size_t count) {
    const std::complex<double> a = Tone(x, frequency, sampleRate, from, count);
    const double w = 2.0 * kPi * frequency / sampleRate;
    double residual = 0.0;
    for (std::size_t n = 0; n < count; ++n) {
        const double fit = std::real(a * std::polar(1.0, w * static_cast<double>(n)));
        const double e = x[from + n] - fit;
        residual += e * e;
    }
    const double sineRms = std::abs(a) / std::sqrt(2.0);
    return 10.0 * std::log10(residual / static_cast<double>(count)) - 20.0 * std::log10(sineRms);
}

float LargestSecondDifference(const std::vector<float>& x, std::size_t from, std::size_t to) {
    to = std::min(to, x.size() - 1);
    float largest = 0.0f;
    for (std::size_t n = std::max<std::size_t>(from, 1); n < to; ++n)
        largest = std::max(largest, std::fabs(x[n + 1] - 2.0f * x[n] + x[n - 1]));
    return largest;
}

double SwitchCurvature(const std::vector<float>& x, std::size_t at, std::size_t window) {
    const float steady = std::max(LargestSecondDifference(x, at - window, at - 1),
                                  LargestSecondDifference(x, at + window, at + 2 * window));
    return LargestSecondDifference(x, at, at + window) / static_cast<double>(steady);
}

double PhaseDelay(const std::vector<float>& impulseResponse, double frequency, double sampleRate) {
    const auto peak = static_cast<double>(ArgPeak(impulseResponse));
    const double w = 2.0 * kPi * frequency / sampleRate;
    std::complex<double> sum = 0.0;
    for (std::size_t n = 0; n < impulseResponse.size(); ++n)
        sum += static_cast<double>(impulseResponse[n]) * std::polar(1.0, -w * (static_cast<double>(n) - peak));
    return peak - std::arg(sum) / w;
}

}  // namespace zentest
