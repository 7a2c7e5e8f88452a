// Short-time Fourier analysis and synthesis of a multichannel stream over
// the FFT engine: In2Dft, the caller's frame processor, Dft2Out, with Hann
// frames of about 21 ms (a power of two: 1024 samples at 44.1 and 48 kHz,
// more at higher rates) overlapping by three quarters. The output is the
// input processed and delayed by Latency() = frame length - 1 samples.
//
// Frames run when the samples written since Reset reach a multiple of the
// hop, whatever the block split; an owner that must set something before a
// frame (a voice decision) processes up to ToNextFrame() at a time.
// Non-finite input samples enter the analysis as silence, finite ones beyond
// kLargestInput at that magnitude (a frame's power stays finite).
//
// Configure allocates; Process and Reset are real-time safe.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "FFT/Engine.h"
#include "FFT/Plugins/Dft2Out.h"
#include "FFT/Plugins/In2Dft.h"
#include "System/AlignedBuffer.h"

namespace zen::noise_reduction {

class zn_stft {
public:
    static constexpr double kFrameSeconds = 1024.0 / 48000.0;
    static constexpr std::size_t kOverlap = 4;
    static constexpr std::size_t kMaxChannels = 64;
    static constexpr float kLargestInput = 1e12f;

    // The power of two nearest kFrameSeconds at `sampleRate` (at least 64).
    static std::size_t FrameLengthFor(double sampleRate);

    // `processor` (not owned) runs on every frame's spectra.
    bool Configure(std::size_t channels, double sampleRate, ora::fft::Plugin* processor);
    bool IsConfigured() const { return m_engine.IsConfigured(); }
    void Reset() noexcept;

    std::size_t Latency() const { return m_frameLength - 1; }
    std::size_t FrameLength() const { return m_frameLength; }
    std::size_t Hop() const { return m_hop; }
    std::size_t Bins() const { return m_frameLength / 2 + 1; }
    std::size_t ToNextFrame() const;

    // Samples [offset, offset + count) of every channel, in place.
    void Process(float* const* channels, std::size_t offset, std::size_t count) noexcept;

private:
    ora::fft::Engine m_engine;
    ora::fft::In2Dft m_in2dft;
    ora::fft::Dft2Out m_dft2out;
    std::size_t m_channels = 0;
    std::size_t m_frameLength = 0;
    std::size_t m_hop = 0;
    std::uint64_t m_written = 0;
    std::vector<ora::AlignedBuffer<float>> m_input;  // a sanitised copy of one hop per channel
};

}  // namespace zen::noise_reduction
