// Spectrum analyser of up to 8 channels over the library's FFT: frames of
// "Size" points every quarter frame through a choice of windows, power per
// bin scaled so that a full-scale sine on a bin reads 1 (0 dBFS) whatever
// the window, averaged exponentially over "Average" ms, with a peak hold
// falling by "Decay" dB/s, and third-octave band levels on the same scale.
// "Mode" shows each channel or all of them together (the mean of their
// powers, so that nothing cancels).
//
// Everything is allocated by Prepare for the largest size, so parameters
// may change on the audio thread. The buffers are read, never written; NaN
// and infinite samples count as silence. Frames fall on the same samples
// for any block split. Results are for the owner's thread, between blocks.
#pragma once

#include <cstdint>
#include <memory>
#include <vector>

#include "../ZenAudioAlgorithm.h"
#include "FFT/FFT.h"
#include "OctaveBands.h"
#include "System/AlignedBuffer.h"

class SpectrumAnalyzer : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t { kSize, kWindow, kAverage, kDecay, kMode };
    enum WindowShape { kRectangular, kHann, kBlackmanHarris, kFlatTop };
    enum Mode { kPerChannel, kSummed };

    static constexpr std::size_t kSmallestSize = 1024;
    static constexpr std::size_t kSizes = 6;  // 1024 to 32768
    static constexpr std::size_t kLargestSize = kSmallestSize << (kSizes - 1);
    static constexpr std::size_t kFramesPerSize = 4;  // a frame every quarter of its length

    SpectrumAnalyzer();
    static const zen::ParameterTableDefinition& Definitions();

    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    bool SetParameter(std::uint64_t index, float value) override;
    // Clears the history, the averages and the peaks.
    void Reset() override;
    bool Process(float* const* channels, std::uint64_t count) override;

    std::size_t Size() const { return m_size; }
    std::size_t Bins() const { return m_size / 2 + 1; }
    std::size_t MaxBins() const { return kLargestSize / 2 + 1; }
    double BinFrequency(std::size_t bin) const { return bin * static_cast<double>(GetSampleRate()) / m_size; }
    // Rows of results: one per channel, or one in "Summed" mode.
    std::size_t Rows() const;
    // Power per bin (Bins() of them), 1 for a full-scale sine.
    const float* Spectrum(std::size_t row) const { return m_average.data() + row * MaxBins(); }
    const float* PeakHold(std::size_t row) const { return m_peak.data() + row * MaxBins(); }
    // Power per band (OctaveBands::kBands), 1 for a full-scale sine.
    const float* Bands(std::size_t row) const { return m_bands.data() + row * zen::OctaveBands::kBands; }
    // Frames analysed since the reset.
    std::uint64_t Frames() const { return m_frames; }
    // Samples to go until the next frame is analysed.
    std::size_t UntilFrame() const { return m_untilFrame; }

private:
    // New coefficients; `reshaped` (size, window or rows) also a new window
    // and cleared results.
    void Configure(bool reshaped) noexcept;
    void Analyse() noexcept;

    std::vector<std::unique_ptr<ora::fft::FFT>> m_ffts;  // one per size
    std::size_t m_sizeIndex = 2;
    std::size_t m_size = 4096;
    int m_window = kBlackmanHarris;
    int m_mode = kPerChannel;
    double m_averageMs = 300.0;
    double m_decayDbPerSecond = 10.0;
    float m_smoothing = 0.0f;  // per frame
    float m_fall = 1.0f;       // per frame
    float m_binScale = 1.0f;   // power of a bin
    float m_bandScale = 1.0f;  // a band: the bin scale over the window's noise bandwidth in bins

    ora::AlignedBuffer<float> m_history;  // per channel, kLargestSize
    std::size_t m_written = 0;            // samples per channel since the reset
    std::size_t m_untilFrame = 0;
    ora::AlignedBuffer<float> m_shape;  // the window, m_size
    ora::AlignedBuffer<float> m_frame;
    std::vector<ora::fft::Complex> m_bins;
    ora::AlignedBuffer<float> m_power;    // one frame, per row
    ora::AlignedBuffer<float> m_average;  // per row
    ora::AlignedBuffer<float> m_peak;
    ora::AlignedBuffer<float> m_bands;
    zen::OctaveBands m_octaves;
    std::uint64_t m_frames = 0;
    bool m_prepared = false;
    std::size_t m_preparedChannels = 0;
};
