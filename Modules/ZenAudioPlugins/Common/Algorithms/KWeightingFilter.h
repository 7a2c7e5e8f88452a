// The K-weighting of loudness measurement: a high shelf of about +4 dB above
// 2 kHz (the head) followed by a second-order high-pass near 38 Hz (the
// revised low-frequency B curve). Both stages come from their analogue
// prototypes by the bilinear transform, prewarped at each stage's corner, so
// every rate gets the response the 48 kHz coefficients describe; at 48 kHz
// the design reproduces those published coefficients to 1e-12.
//
// The recursion runs in double precision: the high-pass's poles sit within
// 0.01 of z = 1, where single precision would colour the low end.
#pragma once

#include <array>
#include <cstddef>
#include <vector>

namespace zen {

class KWeightingFilter {
public:
    // y = b0 x + b1 x[-1] + b2 x[-2] - a1 y[-1] - a2 y[-2]
    struct Section {
        double b0, b1, b2, a1, a2;
    };
    using Design = std::array<Section, 2>;  // shelf, then high-pass

    // The analogue prototypes.
    static constexpr double kShelfFrequency = 1681.974450955533;  // Hz
    static constexpr double kShelfGainDb = 3.999843853973347;
    static constexpr double kShelfQ = 0.7071752369554196;
    static constexpr double kShelfMidExponent = 0.4996667741545416;  // mid-band gain = high gain ^ this
    static constexpr double kHighPassFrequency = 38.13547087602444;  // Hz
    static constexpr double kHighPassQ = 0.5003270373238773;
    // The rate whose published coefficients the design reproduces.
    static constexpr double kReferenceRate = 48000.0;

    static Design DesignFor(double sampleRate);

    // Allocates the channels' state (cleared) and designs for the rate.
    void Prepare(double sampleRate, std::size_t channels);
    void Reset() noexcept;

    // Filters `n` samples of one channel and adds the squares of the
    // weighted samples to `sum`, one by one in time order, so any split of
    // a stream accumulates the same value.
    void AccumulatePower(std::size_t channel, const float* x, std::size_t n, double& sum) noexcept;
    // The same for channels `first` and `first + 1` at once: two recursions
    // side by side run in about the time of one.
    void AccumulatePower(std::size_t first, const float* x0, const float* x1, std::size_t n, double& sum0,
                         double& sum1) noexcept;

    const Design& GetDesign() const { return m_design; }
    std::size_t GetChannelCount() const { return m_states.size(); }

private:
    struct State {
        double s1 = 0.0, s2 = 0.0;  // shelf (transposed direct form II)
        double h1 = 0.0, h2 = 0.0;  // high-pass
    };
    // One sample through both stages; the weighted sample.
    static double Step(const Design& d, State& s, double x) noexcept {
        const double u = d[0].b0 * x + s.s1;
        s.s1 = d[0].b1 * x - d[0].a1 * u + s.s2;
        s.s2 = d[0].b2 * x - d[0].a2 * u;
        const double y = d[1].b0 * u + s.h1;
        s.h1 = d[1].b1 * u - d[1].a1 * y + s.h2;
        s.h2 = d[1].b2 * u - d[1].a2 * y;
        return y;
    }
    Design m_design = DesignFor(48000.0);
    std::vector<State> m_states;
};

}  // namespace zen
