// The limiter's gain law stated plainly and run offline over a whole signal,
// for comparison sample for sample with the library's limiter. It shares no
// code with it: only the true-peak reader (ora::numeric::TruePeak, the
// kernel the law names) and the grid lengths, which it derives itself.
//
// Per internal block k of B samples (with a block -1 of the first L samples'
// reading), per channel: the true peak P of the block, read as the kernel
// reports it, L = the kernel's latency, later; with Soft on and P > C, the
// block's samples at or above the knee k = max(0.25, min(C, 1)) become
// sign(x) k tanh(|x|/k) / tanh(1) and its peak is its largest softened
// sample; else its peak is P. T = min(1, C / largest peak) (1 for silence).
// Over the next B output samples: g = T when g > T; else the hold counts
// down; else g = (1 - c) T + c g; then g = min(g, 1); at the start of each
// block the hold is 4 (L + D). The output is g times the input delayed by
// B + L + D (block, true-peak latency, look-ahead D).
#pragma once

#include <cstddef>
#include <vector>

namespace zentest {

struct LimiterModel {
    double sampleRate = 48000.0;
    float ceilingDb = 0.0f;  // dBTP, before the 0.2 dB margin
    float releaseMs = 1.0f;
    bool soft = false;
    // The ceiling C per sample, when it moves (overrides ceilingDb).
    std::vector<float> ceiling;

    std::size_t TruePeakLatency() const;
    std::size_t LookAhead() const;  // max(true-peak latency, round(0.5 ms))
    std::size_t Block() const;      // two holds
    std::size_t Latency() const { return Block() + TruePeakLatency() + LookAhead(); }

    // Output of the same length as the input, and the gain per output sample.
    std::vector<std::vector<float>> Run(const std::vector<std::vector<float>>& input,
                                        std::vector<float>* gains = nullptr) const;
};

}  // namespace zentest
