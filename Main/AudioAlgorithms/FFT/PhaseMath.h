// Phase arithmetic shared by the frame plug-ins.
#pragma once

#include <cmath>

namespace ora::fft {

constexpr double kTwoPi = 6.283185307179586;

// The principal argument: the phase wrapped into [-pi, pi).
inline double Princarg(double phase) {
    return phase - kTwoPi * std::floor((phase + M_PI) / kTwoPi);
}

}  // namespace ora::fft
