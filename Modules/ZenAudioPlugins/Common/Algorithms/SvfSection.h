// A BiQuad design run as a state-variable filter (trapezoidal integrators),
// for filters whose coefficients move while audio runs. The direct form of
// BiQuad keeps internal values scaled by the inverse of its poles, huge for
// a low corner, so that a small change of coefficients makes a large step in
// the output; the integrators of this form hold the band- and low-pass
// signals themselves, which a change of coefficients leaves continuous.
//
// Any stable design maps on exactly: its poles give the integrators' gain g
// and damping k, its zeros a mix of input, band and low outputs. The
// response is the design's, up to rounding.
#pragma once

#include <cstdint>
#include <vector>

#include "BiQuad.h"

namespace zen {

class SvfSection {
public:
    // The mapping of a BiQuad's coefficients.
    struct Coefficients {
        double a1 = 1.0, a2 = 0.0, a3 = 0.0;  // of the integrators
        double m0 = 1.0, m1 = 0.0, m2 = 0.0;  // mix of input, band and low outputs
    };
    static Coefficients FromBiQuad(const BiQuad::Coefficients& c);

    // New channels start cleared. Allocates.
    void SetChannelCount(std::uint64_t channels);
    // Takes new coefficients; the state carries on.
    void Set(const BiQuad::Coefficients& c) { m_coefficients = FromBiQuad(c); }
    void Reset();
    // In place, every channel.
    void Process(float* const* channels, std::uint64_t count) noexcept;

private:
    struct State {
        double ic1 = 0.0, ic2 = 0.0;
    };
    Coefficients m_coefficients;
    std::vector<State> m_states;
};

}  // namespace zen
