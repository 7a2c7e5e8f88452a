// Runs the spectral denoiser over test material the way a plug-in does and
// gives back what the quality tests measure: the output lined up with the
// input, the gains of every frame, and the clean speech passed through the
// same gains.
#pragma once

#include <cstddef>
#include <vector>

#include "Common/NoiseReduction/zn_denoise_settings.h"
#include "FFT/Plugin.h"

namespace zentest {

struct Denoised {
    std::vector<float> output;              // lined up with the input
    std::vector<std::vector<float>> gains;  // per frame, per bin
};

// Mono. When `learnFrames` > 0 the first samples are learnt as the noise
// profile in a first pass (Learn on), then the whole signal is processed.
Denoised RunDenoiser(const std::vector<float>& input, double sampleRate,
                     const zen::noise_reduction::zn_denoise_settings& settings, std::size_t learnFrames = 0);

// `input` through the STFT with `gains` applied frame by frame, lined up.
std::vector<float> ApplyGains(const std::vector<float>& input, double sampleRate,
                              const std::vector<std::vector<float>>& gains);

// Plain power spectral subtraction on the same STFT, the noise power known
// (the mean periodogram of `noise`): gain sqrt(max(1 - noise/power, floor^2)).
std::vector<float> SpectralSubtraction(const std::vector<float>& input, const std::vector<float>& noise,
                                       double sampleRate, float floor);

}  // namespace zentest
