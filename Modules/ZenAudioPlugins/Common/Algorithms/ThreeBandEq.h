// Three-band equaliser of a channel strip: a low shelf, a bell and a high
// shelf, each designed by a BiQuad and run as a state-variable section, so
// that gains and frequencies glide under automation without steps. A band
// at 0 dB is switched out (an exact wire, and no work); it starts from
// cleared state when its gain leaves 0 dB, where it is itself close to a
// wire, so nothing clicks.
#pragma once

#include <cstdint>

#include "../ZenAudioAlgorithm.h"
#include "BiQuad.h"
#include "SvfSection.h"

class ThreeBandEq : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t { kLowGain, kLowFrequency, kMidGain, kMidFrequency, kMidQ, kHighGain, kHighFrequency };
    // Quality of the shelves: the flattest transition without overshoot.
    static constexpr float kShelfQ = 0.70710678f;

    ThreeBandEq();

    static const zen::ParameterTableDefinition& Definitions();

    // Defaults at the new rate, state cleared.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    void SetChannelCount(std::uint64_t channels) override;
    bool SetParameter(std::uint64_t index, float value) override;
    void Reset() override;
    bool Process(float* const* channels, std::uint64_t count) override;

    // Seconds for the ringing of one band to fall by `decayDb`: a bound
    // from its poles, which sit at f / A with quality q A at most (A the
    // square root of the band's linear gain or its inverse).
    static double RingSeconds(double gainDb, double frequency, double q, double decayDb);

    // Band 0 (low shelf), 1 (bell) or 2 (high shelf) as it runs now: the
    // wire while it is switched out.
    BiQuad::Coefficients BandCoefficients(int band) const {
        return m_enabled[band] ? m_designs[band].GetCoefficients() : BiQuad::Coefficients{};
    }

private:
    BiQuad m_designs[3];
    zen::SvfSection m_bands[3];
    bool m_enabled[3] = {};
};
