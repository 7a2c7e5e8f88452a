// The prototype the up- and down-samplers use when none is given: a Kaiser
// low-pass whose transition band straddles the low rate's Nyquist
// frequency, so that the audio band passes and whatever images or aliases
// are left land above it. With 48 taps per phase the pass band reaches
// 20 kHz at a 44.1 kHz low rate (within 0.05 dB there and back); with 32,
// 20 kHz at 48 kHz.
#pragma once

#include <cstddef>
#include <vector>

namespace ora::numeric {

constexpr double kPolyphaseCutoff = 1.0;  // of the low rate's Nyquist: the -6 dB point
constexpr double kPolyphaseBeta = 8.0;    // about 80 dB of stop band

std::vector<float> DefaultPolyphasePrototype(std::size_t factor, std::size_t tapsPerPhase);

}  // namespace ora::numeric
