// Where the content of one analysis frame belongs in the synthesis: a
// piecewise-linear map from time after the analysis centre (input samples)
// to time after the synthesis centre (output samples of the stretch),
// through knots such as the centres of the neighbouring frames. Beyond its
// end knots it goes on along its end segments; without knots it is the
// identity.
#pragma once

#include <array>
#include <cstddef>

namespace ora::fft {

class TimeMap {
public:
    static constexpr std::size_t kCapacity = 24;

    void Clear() { m_count = 0; }
    // Knots in increasing order of both times; false when full.
    bool Add(double analysis, double synthesis);
    std::size_t Count() const { return m_count; }

    double operator()(double analysis) const;
    // The steepest segment: the fastest the stretched stream around this
    // frame will be read at, per input sample.
    double MaxSlope() const;
    // True when the map is one straight line (a steady stretch), given as
    // synthesis = offset + slope * analysis.
    bool IsLine(double& slope, double& offset) const;

private:
    std::array<double, kCapacity> m_analysis{};
    std::array<double, kCapacity> m_synthesis{};
    std::size_t m_count = 0;
};

}  // namespace ora::fft
