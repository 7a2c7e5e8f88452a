// Test signals and measurements.
#pragma once

#include <cstdint>
#include <vector>

namespace zentest {

constexpr double kPi = 3.141592653589793;

std::vector<float> Sine(double frequency, double sampleRate, std::size_t frames, double amplitude = 1.0,
                        double phase = 0.0);
// Uniform white noise in [-amplitude, amplitude], reproducible by seed.
std::vector<float> Noise(std::size_t frames, double amplitude = 1.0, std::uint32_t seed = 1);
// Pink noise (about -3 dB per octave, from a sum of one-pole filtered white
// noises), scaled to a sample peak of 1.
std::vector<float> PinkNoise(std::size_t frames, std::uint32_t seed);

std::vector<float> Impulse(std::size_t frames, std::size_t at = 0, float value = 1.0f);
// Notes with harmonics and decaying envelopes over a kick, hi-hats and a
// quiet 9 kHz tone, peaking near 1.5: dense, loud material for dynamics.
std::vector<float> MusicLike(double sampleRate, std::size_t frames);

float Peak(const std::vector<float>& x, std::size_t from = 0, std::size_t to = SIZE_MAX);
double Rms(const std::vector<float>& x, std::size_t from = 0, std::size_t to = SIZE_MAX);
double ToDb(double gain);
// Largest jump between neighbouring samples: a click shows up here.
float LargestStep(const std::vector<float>& x);
// Index of the largest magnitude.
std::size_t ArgPeak(const std::vector<float>& x);
// Amplitude of the component at `frequency` in x[from, to), which should
// hold a whole number of its periods.
double Amplitude(const std::vector<float>& x, double sampleRate, double frequency, std::size_t from, std::size_t to);
// Magnitude in dB at `frequency` of an impulse response (its DFT there).
double MagnitudeDb(const std::vector<float>& impulseResponse, double frequency, double sampleRate);

// Delay of `test` against `reference` in samples (positive: later), from
// the peak of the cross-correlation of their energy envelopes (squares
// smoothed over +-`smoothing` samples by a Hann window), searched within
// +-maxLag and interpolated between samples. Holds for signals whose
// waveform a process changes but whose events it keeps in place.
double EnvelopeLag(const std::vector<float>& reference, const std::vector<float>& test, int maxLag,
                   int smoothing = 48);

}  // namespace zentest
