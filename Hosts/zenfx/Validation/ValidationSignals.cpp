#include "ValidationSignals.h"

#include <algorithm>
#include <cmath>
#include <iomanip>
#include <sstream>

namespace zenfx::signals {

namespace {
constexpr double kTwoPi = 6.283185307179586;
}

Planar Silence(std::uint32_t channels, std::size_t frames) { return Planar(channels, std::vector<float>(frames, 0.0f)); }

Planar Noise(std::uint32_t channels, std::size_t frames, float amplitude, std::mt19937& random) {
    std::uniform_real_distribution<float> uniform(-amplitude, amplitude);
    Planar signal = Silence(channels, frames);
    for (auto& channel : signal)
        for (float& x : channel) x = uniform(random);
    return signal;
}

Planar Sine(std::uint32_t channels, std::size_t frames, double frequency, double sampleRate, float amplitude) {
    Planar signal = Silence(channels, frames);
    for (std::uint32_t c = 0; c < channels; ++c) {
        // A different phase per channel, so that swapped channels show.
        const double phase = 0.7 * c;
        for (std::size_t i = 0; i < frames; ++i)
            signal[c][i] = static_cast<float>(amplitude * std::sin(kTwoPi * frequency * static_cast<double>(i) / sampleRate + phase));
    }
    return signal;
}

Planar Impulses(std::uint32_t channels, std::size_t frames, std::size_t first, std::size_t spacing, float amplitude) {
    Planar signal = Silence(channels, frames);
    for (auto& channel : signal)
        for (std::size_t i = first; i < frames; i += std::max<std::size_t>(spacing, 1)) channel[i] = amplitude;
    return signal;
}

Planar Constant(std::uint32_t channels, std::size_t frames, float value) {
    return Planar(channels, std::vector<float>(frames, value));
}

Planar Slice(const Planar& signal, std::size_t from, std::size_t count) {
    Planar part;
    for (const auto& channel : signal) {
        const std::size_t begin = std::min(from, channel.size());
        const std::size_t end = std::min(begin + count, channel.size());
        part.emplace_back(channel.begin() + static_cast<std::ptrdiff_t>(begin),
                          channel.begin() + static_cast<std::ptrdiff_t>(end));
    }
    return part;
}

Inspection Inspect(const Planar& signal, std::size_t from) {
    Inspection result;
    for (std::size_t c = 0; c < signal.size(); ++c) {
        const auto& channel = signal[c];
        for (std::size_t i = from; i < channel.size(); ++i) {
            const float x = channel[i];
            if (!std::isfinite(x)) {
                if (result.finite || i < result.firstNonFinite) {
                    result.firstNonFinite = i;
                    result.nonFiniteChannel = c;
                    result.nonFiniteValue = x;
                }
                result.finite = false;
                ++result.nonFiniteCount;
                continue;
            }
            const float magnitude = std::fabs(x);
            if (magnitude > result.peak) {
                result.peak = magnitude;
                result.peakFrame = i;
            }
            if (std::fpclassify(x) == FP_SUBNORMAL) ++result.subnormals;
        }
    }
    return result;
}

double MaxDifference(const Planar& a, const Planar& b, std::size_t* frame) {
    double largest = 0.0;
    std::size_t where = 0;
    for (std::size_t c = 0; c < std::min(a.size(), b.size()); ++c) {
        const std::size_t frames = std::min(a[c].size(), b[c].size());
        for (std::size_t i = 0; i < frames; ++i) {
            const double x = a[c][i];
            const double y = b[c][i];
            // NaN against anything but NaN is a difference.
            const double difference = std::isnan(x) != std::isnan(y) ? INFINITY : (std::isnan(x) ? 0.0 : std::fabs(x - y));
            if (difference > largest) {
                largest = difference;
                where = i;
            }
        }
    }
    if (frame != nullptr) *frame = where;
    return largest;
}

std::string Decibels(double gain) {
    std::ostringstream out;
    if (!(gain > 0.0)) return "-inf dBFS";
    out << std::showpos << std::fixed << std::setprecision(1) << 20.0 * std::log10(gain) << " dBFS";
    return out.str();
}

std::string ValueName(float value) {
    if (std::isnan(value)) return "NaN";
    if (std::isinf(value)) return value > 0 ? "+Inf" : "-Inf";
    std::ostringstream out;
    out << value;
    return out.str();
}

std::string DescribeFault(const Inspection& inspection) {
    std::ostringstream out;
    if (!inspection.finite) {
        out << ValueName(inspection.nonFiniteValue) << " at frame " << inspection.firstNonFinite << " on channel "
            << inspection.nonFiniteChannel + 1 << " (" << inspection.nonFiniteCount << " non-finite sample"
            << (inspection.nonFiniteCount == 1 ? "" : "s") << " in all)";
    } else if (inspection.peak > kOutputLimit) {
        out << "output peak " << inspection.peak << " (" << Decibels(inspection.peak) << ") at frame "
            << inspection.peakFrame << ", above the limit of " << Decibels(kOutputLimit);
    }
    return out.str();
}

}  // namespace zenfx::signals
