// Measurements for delays and modulation effects: the amplitude of one
// frequency, noise and distortion around a sine, and the curvature that
// shows a click.
#pragma once

#include <complex>
#include <cstddef>
#include <vector>

namespace zentest {

// The complex amplitude of `frequency` in x[from, from + count): a full-scale
// sine of a whole number of cycles in the window reads magnitude 1.
std::complex<double> Tone(const std::vector<float>& x, double frequency, double sampleRate, std::size_t from,
                          std::size_t count);
// Everything but the sine at `frequency` (RMS, dB) against that sine's RMS,
// over a window of whole cycles.
double ThdNDb(const std::vector<float>& x, double frequency, double sampleRate, std::size_t from, std::size_t count);
// Largest |x[n + 1] - 2 x[n] + x[n - 1]| in [from, to): a jump or a kink
// stands out against a smooth signal's own curvature.
float LargestSecondDifference(const std::vector<float>& x, std::size_t from = 1, std::size_t to = SIZE_MAX);
// How much a switch at `at` curves x: the largest second difference in
// [at, at + window) against the largest in the steady stretches of `window`
// samples before it and after that. Above 1, the switch clicks.
double SwitchCurvature(const std::vector<float>& x, std::size_t at, std::size_t window);
// The delay in samples (fractional) of an impulse response at a low
// `frequency`: its phase there, measured from the largest sample.
double PhaseDelay(const std::vector<float>& impulseResponse, double frequency, double sampleRate);

}  // namespace zentest
