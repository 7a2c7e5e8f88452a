// What the dynamics algorithms share: levels, thresholds and gains held as
// dB/20 (log10 of a linear amplitude, "log units"), and one-pole envelope
// coefficients derived from times in milliseconds.
#pragma once

#include <algorithm>
#include <cmath>
#include <cstdint>

namespace zen {

// Detector magnitudes are floored here (-100 dB) before the logarithm.
constexpr float kDetectorFloor = 1e-5f;
// and capped here (+80 dB), so an infinite sample cannot lock an envelope up.
constexpr float kDetectorCeiling = 1e4f;
constexpr float kLog2Of10 = 3.32192809f;

inline float DbToLogUnits(float db) { return db / 20.0f; }
inline float LogUnitsToDb(float logUnits) { return logUnits * 20.0f; }

// log10 of a magnitude between the floor and the ceiling; NaN reads as the floor.
inline float LogLevel(float magnitude) {
    magnitude = magnitude > kDetectorFloor ? magnitude : kDetectorFloor;
    magnitude = magnitude < kDetectorCeiling ? magnitude : kDetectorCeiling;
    return std::log10(magnitude);
}

// 10^g; exp2 is the cheaper route to the same value.
inline float LogUnitsToGain(float g) { return std::exp2(g * kLog2Of10); }

// Hold length: trunc(fs * t / 1000) samples, never negative.
inline std::int32_t HoldSamples(int sampleRate, float milliseconds) {
    constexpr float kLongest = 2.0e9f;  // keeps the count inside 32 bits
    const float samples = static_cast<float>(sampleRate) * milliseconds / 1000.0f;
    return samples > 0.0f ? static_cast<std::int32_t>(std::min(samples, kLongest)) : 0;
}

// One-pole envelope step E <- a*E + (1 - a)*L, with a = exp(-1 / (fs * t / 1000)).
struct EnvelopeCoefficients {
    float oneMinusA = 1.0f;
    float a = 0.0f;

    // A time of zero or below follows the input at once.
    static EnvelopeCoefficients FromMilliseconds(int sampleRate, float milliseconds) {
        EnvelopeCoefficients c;
        const float samples = static_cast<float>(sampleRate) * milliseconds / 1000.0f;
        if (samples > 0.0f) {
            c.a = std::exp(-1.0f / samples);
            c.oneMinusA = 1.0f - c.a;
        }
        return c;
    }

    float Step(float envelope, float level) const { return a * envelope + oneMinusA * level; }
};

}  // namespace zen
