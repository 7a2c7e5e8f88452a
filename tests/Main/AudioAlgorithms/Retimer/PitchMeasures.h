// Measurements for the pitch shifter's tests: partial frequencies, the
// shifter run with its latency removed, spectrogram distances, a plain
// (unlocked) phase vocoder as the baseline, and test material.
#pragma once

#include <cstdint>
#include <vector>

#include "Retimer/PitchShiftEngine.h"

namespace zentest {

constexpr double kRate = 48000.0;

// Frequency of the strongest partial within `cents` of `expected`, measured
// on x[from, from + length) (Blackman-Harris window, zero-padded transform,
// log-parabolic peak interpolation). Error well under 0.01 cent for a
// steady partial over 16384 samples.
double PartialFrequency(const std::vector<float>& x, std::size_t from, std::size_t length, double expected,
                        double cents = 40.0);
double Cents(double measured, double expected);

struct ShifterSettings {
    int coarse = 0;
    float fine = 0.0f;
    float dryWet = 100.0f;
    int algorithm = 1;  // 0 PLPV, 1 PGHI
    int mode = 2;       // 0 PG, 1 PV, 2 Auto
    bool joint = true;
};

// Runs `channels` through a fresh pitch-shift engine in blocks of `block`:
// the output as a host gets it, delayed by the latency, same length.
std::vector<std::vector<float>> Stream(const std::vector<std::vector<float>>& channels, const ShifterSettings& s,
                                       std::size_t block = 512);
std::vector<float> Stream(const std::vector<float>& x, const ShifterSettings& s, std::size_t block = 512);
// Streams the input followed by the latency's worth of silence and drops the
// first latency samples: the result lines up with the input, same length.
std::vector<std::vector<float>> Shift(const std::vector<std::vector<float>>& channels, const ShifterSettings& s,
                                      std::size_t block = 512);
std::vector<float> Shift(const std::vector<float>& x, const ShifterSettings& s, std::size_t block = 512);
std::size_t ShifterLatency();

// The baseline: a phase vocoder without phase locking (every bin advances
// on its own instantaneous frequency), same frame, hop and windows, read
// back with the same cubic interpolation; aligned like Shift.
std::vector<float> PlainVocoderShift(const std::vector<float>& x, double ratio);

struct Quality {
    double spectralConvergenceDb;  // 20 log10(|| |S|-|R| || / || |R| ||), lower is better
    double logSpectralDistanceDb;  // mean over frames of the RMS dB difference, lower is better
};
// Compared on x[skip, size - skip) with 2048-sample Hann frames, hop 512;
// powers floored 60 dB below the reference's loudest bin for the distance.
Quality Compare(const std::vector<float>& reference, const std::vector<float>& test, std::size_t skip);

// Test material, mono at 48 kHz.
std::vector<float> HarmonicTone(double f0, int harmonics, std::size_t frames, double amplitude = 0.5);
std::vector<float> Chord(const std::vector<double>& frequencies, std::size_t frames, double amplitude = 0.25);
std::vector<float> Chirp(double f0, double f1, std::size_t frames, double amplitude = 0.5);
std::vector<float> SpeechLike(std::size_t frames);
std::vector<float> Transients(std::size_t frames);
// Single-sample clicks 5000 to 6000 samples apart (more than a frame, so
// each frame holds at most one), the first at 3000.
std::vector<float> Clicks(std::size_t frames, std::uint32_t seed = 1);

}  // namespace zentest
