// General second-order section: one set of coefficients shared by any number
// of channels, each with its own two-word state. Coefficients are designed in
// double precision (bilinear transform, prewarped tan); samples are floats;
// the recursion runs in double (direct form II, numerator normalised to b0).
#pragma once

#include <cstdint>
#include <utility>
#include <vector>

#include "../ZenAudioAlgorithm.h"

class BiQuad : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t { kIn, kShape, kGain, kFreq, kQ };
    // Values of "Shape".
    enum Shape { kLowPass, kHighPass, kLowShelf, kHighShelf, kBell };
    // Internal filter types of the design record.
    enum Type : std::int32_t {
        kWire = 0,
        kShelfPair = 1,  // two first-order shelves, set by code only
        kBellType = 2,
        kLowPassType = 3,
        kBandPassType = 4,  // set by code only
        kHighPassType = 5,
        kLowShelfType = 6,
        kHighShelfType = 7,
    };

    struct Coefficients {
        double c0 = 0.0;  // -a2/a0
        double c1 = 0.0;  // -a1/a0
        double c2 = 0.0;  // b2/b0
        double c3 = 0.0;  // b1/b0
        double g = 1.0;   // b0/a0, applied to the input
    };

    BiQuad();

    static const zen::ParameterTableDefinition& Definitions();

    // Keeps the parameters (unlike the algorithm base) and redesigns them for
    // the new rate; resets the design record and the coefficients first.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    void SetChannelCount(std::uint64_t channels) override;
    bool SetParameter(std::uint64_t index, float value) override;
    void Reset() override;

    bool Process(float* const* channels, std::uint64_t count) override;
    bool ProcessChannel(std::uint64_t channel, float* samples, std::uint64_t count) override;
    // Out of place; the same array for both, or no output, is in place.
    bool Process(float* const* in, float* const* out, std::uint64_t count);

    // Designs that the parameters do not reach. Both respect "In".
    // A low shelf (f1, G1 at DC) times a high shelf (f2, G2 at Nyquist), first order each.
    void SetShelfPair(double f1, double g1, double f2, double g2);
    // Band-pass around f, Q warped as for the bell.
    void SetBandPass(double frequency, double q);

    const Coefficients& GetCoefficients() const { return m_coefficients; }
    std::int32_t GetType() const { return m_type; }
    bool IsEnabled() const { return m_enabled; }

private:
    struct State {
        double w1 = 0.0;  // newest internal value
        double w2 = 0.0;
    };
    void Design();
    void ProcessRun(State& state, const float* in, float* out, std::uint64_t count) const noexcept;
    void ProcessPair(State& left, State& right, const float* const* in, float* const* out,
                     std::uint64_t count) const noexcept;

    std::vector<State> m_states;
    Coefficients m_coefficients;
    bool m_enabled = false;

    // Design record.
    std::int32_t m_type = kBellType;
    double m_frequency = 1000.0;
    double m_q = 0.333333333;
    double m_gain = 1.0;  // linear
    double m_f1 = 0.0, m_g1 = 1.0, m_f2 = 0.0, m_g2 = 1.0;
};
