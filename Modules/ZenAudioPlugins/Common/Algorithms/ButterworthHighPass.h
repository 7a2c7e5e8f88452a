// Butterworth high-pass of order 2 or 4 (12 or 24 dB per octave) for the low
// end of a strip: rumble, handling noise, proximity boom. BiQuad designs the
// sections; they run as state-variable sections, so the corner can glide
// under automation without steps in the output. Any number of channels; no
// latency.
#pragma once

#include <cstdint>

#include "../ZenAudioAlgorithm.h"
#include "BiQuad.h"
#include "SvfSection.h"

class ButterworthHighPass : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t { kFrequency, kSlope };
    // Values of "Slope".
    enum Slope { kTwelveDb, kTwentyFourDb };
    // Quality of the sections: 1 / (2 cos(pi/4)) for order 2, and
    // 1 / (2 cos(pi/8)), 1 / (2 cos(3 pi/8)) for order 4.
    static constexpr double kSecondOrderQ = 0.70710678118654752;
    static constexpr double kFourthOrderQ[2] = {0.54119610014619698, 1.30656296487637653};

    ButterworthHighPass();

    static const zen::ParameterTableDefinition& Definitions();

    // Defaults at the new rate, state cleared.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    void SetChannelCount(std::uint64_t channels) override;
    bool SetParameter(std::uint64_t index, float value) override;
    void Reset() override;
    bool Process(float* const* channels, std::uint64_t count) override;

    // Seconds for the filter's ringing to fall by `decayDb` (its slowest
    // pole), for a corner `frequency` and a "Slope" value.
    static double RingSeconds(double frequency, int slope, double decayDb);

    // The sections that run now (one, or two at 24 dB/oct).
    int SectionCount() const { return m_fourthOrder ? 2 : 1; }
    const BiQuad::Coefficients& SectionCoefficients(int section) const { return m_designs[section].GetCoefficients(); }

private:
    void Design();

    BiQuad m_designs[2];
    zen::SvfSection m_sections[2];
    bool m_fourthOrder = true;
};
