// The console's test signals as a device callback: a sine, pink or white
// noise, or a logarithmic sweep, on one channel or all of them.
//
// Levels are exact: a sine's peak is the level (phase from the sample index
// in double precision, so THD+N stays near the float format's floor), a
// sweep's peak likewise, and noise is scaled so that its RMS over the whole
// tone is that of a sine of the level (0 dBFS: RMS 0.7071).
#pragma once

#include <cstdint>

#include "HostCore/Devices/AudioDevice.h"
#include "HostCore/Settings/Documents/OscillatorDocument.h"

namespace zen::host {

class TestToneGenerator : public AudioCallback {
public:
    using Tone = OscillatorDocument::Tone;

    // Measures the noise once (same seed) to know its scale; allocates nothing after.
    explicit TestToneGenerator(const Tone& tone);

    std::uint64_t Frames() const { return m_frames; }
    void ProcessBlock(const float* const* inputs, float* const* outputs, std::uint32_t frames) noexcept override;

    // Renders the tone into a file through the file device.
    static void Render(const Tone& tone, const std::string& outputPath);

private:
    struct Noise {
        std::uint64_t state;
        double pink[7] = {};
        double Next(bool pinkNoise) noexcept;
    };

    double Sample() noexcept;

    Tone m_tone;
    std::uint64_t m_frames;
    std::uint64_t m_position = 0;
    double m_amplitude;
    double m_noiseScale = 1.0;
    Noise m_noise;
};

}  // namespace zen::host
