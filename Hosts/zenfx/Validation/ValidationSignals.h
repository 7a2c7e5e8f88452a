// Planar test signals for the validator, and what it measures on outputs.
#pragma once

#include <cstddef>
#include <cstdint>
#include <random>
#include <string>
#include <vector>

namespace zenfx {

// channels[c][i], one vector per channel.
using Planar = std::vector<std::vector<float>>;

namespace signals {

// Output magnitudes at or below this are silence (-100 dBFS).
constexpr float kSilence = 1e-5f;
// Output magnitudes above this, for input at most full scale, are a fault
// (+40 dBFS: far beyond any gain a plug-in of the library offers).
constexpr float kOutputLimit = 100.0f;

Planar Silence(std::uint32_t channels, std::size_t frames);
// Uniform white noise in [-amplitude, amplitude], independent per channel.
Planar Noise(std::uint32_t channels, std::size_t frames, float amplitude, std::mt19937& random);
Planar Sine(std::uint32_t channels, std::size_t frames, double frequency, double sampleRate, float amplitude);
// One impulse every `spacing` frames, starting at `first`.
Planar Impulses(std::uint32_t channels, std::size_t frames, std::size_t first, std::size_t spacing, float amplitude);
Planar Constant(std::uint32_t channels, std::size_t frames, float value);
// Frames [from, from + count) of a signal.
Planar Slice(const Planar& signal, std::size_t from, std::size_t count);

struct Inspection {
    bool finite = true;
    std::size_t firstNonFinite = 0;  // frame of the first NaN or infinity
    std::size_t nonFiniteChannel = 0;
    float nonFiniteValue = 0.0f;
    std::size_t nonFiniteCount = 0;
    float peak = 0.0f;               // largest finite magnitude
    std::size_t peakFrame = 0;
    std::size_t subnormals = 0;
};

// Looks at frames from `from` on, every channel.
Inspection Inspect(const Planar& signal, std::size_t from = 0);

// Largest |a - b| over common frames and channels, and where it is.
double MaxDifference(const Planar& a, const Planar& b, std::size_t* frame = nullptr);

// "NaN at frame 17 on channel 2 (30 non-finite samples in all)", "peak 143.2
// (+43.1 dBFS) at frame 4", "" when neither.
std::string DescribeFault(const Inspection& inspection);

std::string Decibels(double gain);
// "NaN", "+Inf", "-Inf", or the number ("1e+19").
std::string ValueName(float value);

}  // namespace signals
}  // namespace zenfx
