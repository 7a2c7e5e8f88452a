// Loudness and level metering of any number of channels after ITU-R BS.1770-4
// and EBU R 128: momentary (400 ms) and short-term (3 s) loudness with
// their maxima, integrated (gated) loudness and loudness range over
// everything since the last reset, and per channel the sample peak, the
// true peak (4x oversampled), the RMS over 400 ms and since the reset.
//
// Time runs in hops of 100 ms, each cut into 20 sub-blocks of about 5 ms.
// Each sub-block's K-weighted mean squares are summed over the channels by
// their weights; at every sub-block's end the momentary and short-term
// windows are summed anew (no running sums to drift), so their maxima
// catch any window to within 2.5 ms, not only those the 10 Hz grid sees.
// At every hop's end the 400 ms window is a gating block (75 % overlap) and
// the 3 s window a short-term value for the range.
//
// The buffers are read, never written: audio passes unchanged, latency 0.
// Readings depend only on the samples, never on the block split. A NaN or
// infinite sample counts as silence (and is counted), so it cannot poison
// the filters or the integrated loudness. Readings are for the owner's
// thread, between blocks; loudness in LUFS, -inf for silence.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

#include "../ZenAudioAlgorithm.h"
#include "Algorithms/TruePeak.h"
#include "IntegratedLoudness.h"
#include "KWeightingFilter.h"
#include "LoudnessRange.h"
#include "System/AlignedBuffer.h"

class LoudnessMeter : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    static constexpr double kHopSeconds = 0.1;
    static constexpr std::size_t kMomentaryHops = 4;    // 400 ms
    static constexpr std::size_t kShortTermHops = 30;   // 3 s
    static constexpr std::size_t kSubBlocksPerHop = 20;

    LoudnessMeter();

    // Per-channel state for `channels`, weights as SpeakerLayout says for
    // that count with its default LFE.
    void SetChannelCount(std::uint64_t channels) override;
    // Designs the filters for the rate, sizes everything, then Reset.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    // Forgets everything measured (maxima, integrated, range, peaks).
    void Reset() override;
    // Measures; the buffers are left as they are.
    bool Process(float* const* channels, std::uint64_t count) override;

    // No allocation: for the audio thread.
    void SetChannelWeight(std::size_t channel, double weight);
    double GetChannelWeight(std::size_t channel) const;
    // Off saves the oversampling; true peaks then read as sample peaks.
    // Turning it on starts the oversampler from silence.
    void SetTruePeakEnabled(bool enabled);
    bool IsTruePeakEnabled() const { return m_truePeakEnabled; }

    // At the last sub-block's end.
    double Momentary() const { return zen::LoudnessHistogram::Lufs(m_momentary); }
    double ShortTerm() const { return zen::LoudnessHistogram::Lufs(m_shortTerm); }
    double MaxMomentary() const { return zen::LoudnessHistogram::Lufs(m_maxMomentary); }
    double MaxShortTerm() const { return zen::LoudnessHistogram::Lufs(m_maxShortTerm); }
    // LUFS, -inf while nothing lies above the gates; updated every 100 ms.
    double Integrated() const { return m_integrated; }
    // LU, 0 until a 3 s window lies above the gates; updated every 100 ms.
    double Range() const { return m_range; }
    double RangeLow() const { return m_rangeLow; }
    double RangeHigh() const { return m_rangeHigh; }
    // LUFS of one channel alone (unweighted) over the momentary window.
    double ChannelMomentary(std::size_t channel) const;

    // Linear, largest since the reset; the true peak is never below the
    // sample peak, so the last samples, still inside the oversampler, count.
    float SamplePeak(std::size_t channel) const { return m_channels[channel].samplePeak; }
    float TruePeak(std::size_t channel) const;
    // Linear RMS over the momentary window, and over everything since the reset.
    double Rms(std::size_t channel) const;
    double AverageRms(std::size_t channel) const;

    // NaN and infinite samples met since the reset, over all channels.
    std::uint64_t InvalidSamples() const { return m_invalid; }
    std::uint64_t FramesMeasured() const { return m_frames; }
    // Gating blocks and short-term windows completed since the reset.
    std::uint64_t Hops() const { return m_hops; }
    std::size_t HopLength() const { return m_hopLength; }

private:
    struct Channel {
        double weight = 1.0;
        double kPower = 0.0;      // K-weighted sum of squares of the open sub-block
        double plainPower = 0.0;  // sum of squares of the open sub-block
        double plainTotal = 0.0;  // since the reset
        float samplePeak = 0.0f;
        float truePeak = 0.0f;
        std::uint64_t blockInvalid = 0;  // in the block being processed
    };

    void Allocate();
    void Measure(std::size_t channel, const float* x, std::size_t n) noexcept;
    void MeasurePair(std::size_t first, const float* x0, const float* x1, std::size_t n) noexcept;
    // Sample peak and plain power; the NaN and infinities met.
    std::size_t MeasureLevels(std::size_t channel, const float* x, std::size_t n) noexcept;
    void MeasureLoudness(std::size_t channel, const float* x, std::size_t n) noexcept;
    void MeasureTruePeaks(const float* const* channels, std::size_t count) noexcept;
    void CloseSubBlock() noexcept;
    void CloseHop() noexcept;
    static double SumLast(const double* ring, std::size_t size, std::size_t end, std::size_t count) noexcept;

    std::vector<Channel> m_channels;
    zen::KWeightingFilter m_kWeighting;
    std::vector<std::unique_ptr<ora::numeric::TruePeak>> m_truePeaks;  // channel pairs
    bool m_truePeakEnabled = true;

    // Sub-block ends inside a hop, in samples from its start.
    std::size_t m_hopLength = 4800;
    std::size_t m_subEnds[kSubBlocksPerHop] = {};
    std::size_t m_hopPosition = 0;
    std::size_t m_subBlock = 0;

    // Rings of sub-blocks: weighted K power for 3 s; per channel, K power and
    // plain power for 400 ms (channel-major).
    std::vector<double> m_weightedRing;
    std::vector<double> m_channelKRing;
    std::vector<double> m_channelPlainRing;
    std::size_t m_ringPosition = 0;      // next slot of the 3 s ring
    std::size_t m_channelPosition = 0;  // next slot of the 400 ms rings

    // Mean squares (powers) at the last sub-block's end.
    double m_momentary = 0.0;
    double m_shortTerm = 0.0;
    double m_maxMomentary = 0.0;
    double m_maxShortTerm = 0.0;

    zen::IntegratedLoudness m_integratedBlocks;
    zen::LoudnessRange m_rangeWindows;
    double m_integrated;
    double m_range = 0.0;
    double m_rangeLow;
    double m_rangeHigh;

    std::uint64_t m_hops = 0;
    std::uint64_t m_frames = 0;
    std::uint64_t m_invalid = 0;

    // NaN-free copies for the filters and the oversampler.
    static constexpr std::size_t kCleanLength = 1024;  // per channel, two channels
    ora::AlignedBuffer<float> m_clean;
};
