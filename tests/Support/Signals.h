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
std::vector<float> Impulse(std::size_t frames, std::size_t at = 0, float value = 1.0f);

float Peak(const std::vector<float>& x, std::size_t from = 0, std::size_t to = SIZE_MAX);
double Rms(const std::vector<float>& x, std::size_t from = 0, std::size_t to = SIZE_MAX);
double ToDb(double gain);
// Largest jump between neighbouring samples: a click shows up here.
float LargestStep(const std::vector<float>& x);
// Index of the largest magnitude.
std::size_t ArgPeak(const std::vector<float>& x);
// |sum of x[n] e^(-j w n)| in dB at `frequency`: the response of a filter
// whose impulse response is x.
double ResponseDb(const std::vector<float>& x, double sampleRate, double frequency);
// Amplitude of the component at `frequency` in x[from, to), which should
// hold a whole number of its periods.
double Amplitude(const std::vector<float>& x, double sampleRate, double frequency, std::size_t from, std::size_t to);

}  // namespace zentest
