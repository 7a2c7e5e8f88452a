// Sine tone programmes made of segments with a level per channel, streamed
// block by block so that minutes of multichannel audio need no memory: the
// signals loudness meters are tested with.
#pragma once

#include <cstddef>
#include <vector>

namespace zentest {

struct ToneSegment {
    double seconds;
    // Peak level in dBFS per channel (one value: every channel); -inf: silence.
    std::vector<double> dbfs;
};

class ToneProgram {
public:
    // A sine of `frequency` (whole Hz) with `phase` (radians) at sample 0,
    // phase-continuous across segments, at a whole-Hz rate.
    ToneProgram(double sampleRate, std::size_t channels, std::vector<ToneSegment> segments,
                double frequency = 1000.0, double phase = 0.0);

    std::size_t Frames() const { return m_frames; }
    std::size_t Position() const { return m_position; }
    // Writes the next `n` frames into planar `out` (resized to the channels,
    // each to `n`); silence after the end. Returns the frames of programme.
    std::size_t Next(std::vector<std::vector<float>>& out, std::size_t n);
    // The whole programme, planar.
    std::vector<std::vector<float>> All();

private:
    std::size_t m_channels;
    std::vector<float> m_period;            // one whole number of cycles
    std::vector<std::size_t> m_segmentEnd;  // frames
    std::vector<std::vector<float>> m_gains;
    std::size_t m_frames = 0;
    std::size_t m_position = 0;
};

}  // namespace zentest
