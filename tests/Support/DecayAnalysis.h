// Decay time of an impulse response, as acousticians measure it: the
// response filtered to an octave band, Schroeder's backward integration, a
// straight line fitted between -5 and -35 dB, extrapolated to -60 dB.
#pragma once

#include <vector>

namespace zentest {

// The response through an octave band-pass around `centre` (two band-pass
// biquads in cascade).
std::vector<float> OctaveBand(const std::vector<float>& x, double centre, double sampleRate);

// Schroeder's decay curve in dB (0 dB at the start).
std::vector<double> SchroederCurve(const std::vector<float>& x);

// Seconds to fall 60 dB, from the line fitted to the curve between `fromDb`
// and `toDb` below its start; 0 when the curve never gets that low.
double DecayTime(const std::vector<float>& x, double sampleRate, double fromDb = -5.0, double toDb = -35.0);

// DecayTime of the octave band around `centre`.
double BandDecayTime(const std::vector<float>& x, double centre, double sampleRate);

}  // namespace zentest
