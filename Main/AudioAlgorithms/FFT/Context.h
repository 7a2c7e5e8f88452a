// What the FFT engine tells its frame plug-ins about the frame being run.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "FFT/Buffer.h"
#include "FFT/FFT.h"
#include "FFT/TimeMap.h"
#include "FFT/Window.h"

namespace ora::fft {

struct Context {
    std::size_t channels = 0;
    // Rows of the per-channel spectral variables: the channels, plus one
    // shared row when channels are reconstructed jointly.
    std::size_t rows = 0;
    std::size_t frameLength = 0;
    std::size_t fftLength = 0;
    std::size_t bins = 0;
    std::size_t synthesisHop = 0;
    // Input samples from the previous frame's centre to this one's; not
    // necessarily whole (a stretch places its frames on a fine grid).
    double analysisHop = 0.0;
    std::int64_t analysisStart = 0;  // input position of the frame's first sample
    // The frame's centre minus that of the samples read (start + frameLength / 2),
    // within half a sample: phases are measured at the centre.
    double analysisOffset = 0.0;
    // Where this frame's content belongs in the synthesis, when the caller
    // knows better than a uniform stretch around the centre (null).
    const TimeMap* timeMap = nullptr;
    std::uint64_t frameIndex = 0;    // frames run since the last reset
    float gain = 1.0f;               // applied on synthesis
    std::size_t bandLimit = 0;       // bins from here up are silenced on synthesis; 0: none
    bool joint = false;              // one phase decision for all channels (the shared row)

    FFT* fft = nullptr;
    const Window* window = nullptr;
    std::vector<Buffer>* in = nullptr;   // input history per channel
    std::vector<Buffer>* out = nullptr;  // overlap-add accumulators per channel

    // The rows whose phases are reconstructed: the shared row when joint,
    // else every channel's.
    std::size_t FirstReconstructedRow() const { return joint && rows > channels ? channels : 0; }
    std::size_t EndReconstructedRow() const { return joint && rows > channels ? channels + 1 : channels; }
    bool SharedRow() const { return joint && rows > channels; }
    // Synthesis time per analysis time around this frame.
    double Stretch() const { return static_cast<double>(synthesisHop) / analysisHop; }
    // Time after the synthesis centre of content `time` after the analysis
    // centre, and whether that is a straight line (slope and offset).
    double SynthesisTime(double time) const { return timeMap != nullptr ? (*timeMap)(time) : Stretch() * time; }
    bool SynthesisLine(double& slope, double& offset) const {
        if (timeMap != nullptr) return timeMap->IsLine(slope, offset);
        slope = Stretch();
        offset = 0.0;
        return true;
    }
    // Whether the frame's content moves within it at all on synthesis.
    bool Stretched() const {
        double slope, offset;
        return !SynthesisLine(slope, offset) || slope != 1.0 || offset != 0.0;
    }
};

}  // namespace ora::fft
