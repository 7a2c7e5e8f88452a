// Measures of a denoised signal against the clean speech it should match
// (both aligned, the same length).
#pragma once

#include <vector>

namespace zentest {

// 10 log10 of the reference's energy over the error's.
double SnrDb(const std::vector<float>& estimate, const std::vector<float>& reference);
// Mean over 20 ms frames where the reference is active (within 40 dB of its
// loudest frame) of each frame's SNR clamped to [-10, 35] dB.
double SegmentalSnrDb(const std::vector<float>& estimate, const std::vector<float>& reference, double sampleRate);
// Scale-invariant signal-to-distortion ratio: the reference scaled to its
// projection on the estimate, over what is left of the estimate.
double SiSdrDb(const std::vector<float>& estimate, const std::vector<float>& reference);

// Musical noise: isolated spectral peaks per second. In a Hann STFT of
// non-overlapping 1024-sample frames (at 48 kHz; scaled with the rate), a
// time-frequency bin counts when it is the largest of its 3 x 3
// neighbourhood, stands at least kIsolatedPeakDb above the median of its
// eight neighbours, and is no more than 60 dB below the loudest bin of the
// signal. White noise itself shows about 110 such peaks per second; the
// sparse bins that spectral subtraction lets through, about 900.
constexpr double kIsolatedPeakDb = 10.0;
double IsolatedPeaksPerSecond(const std::vector<float>& x, double sampleRate);

}  // namespace zentest
