// Linear-phase low-pass prototypes for the polyphase up- and down-samplers:
// a windowed sinc (Kaiser window), normalised to unit gain at DC.
#pragma once

#include <cstddef>
#include <vector>

namespace ora::numeric {

// `taps` coefficients; `cutoff` in cycles per sample (0 < cutoff < 0.5);
// `beta` the Kaiser window's shape (8 gives about 80 dB of stop band).
std::vector<float> KaiserLowPass(std::size_t taps, double cutoff, double beta);

// Modified Bessel function of the first kind, order 0.
double BesselI0(double x);

}  // namespace ora::numeric
