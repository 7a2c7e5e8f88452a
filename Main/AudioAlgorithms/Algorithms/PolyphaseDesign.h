// The prototype the up- and down-samplers use when none is given: a Kaiser
// low-pass at the low rate's Nyquist, a little below it so that images and
// aliases land above the audio band.
#pragma once

#include <cstddef>
#include <vector>

namespace ora::numeric {

constexpr double kPolyphaseCutoff = 0.46;  // of the low rate's Nyquist
constexpr double kPolyphaseBeta = 8.0;     // about 80 dB of stop band

std::vector<float> DefaultPolyphasePrototype(std::size_t factor, std::size_t tapsPerPhase);

}  // namespace ora::numeric
