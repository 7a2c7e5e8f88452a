// Splits every channel into up to five bands with Linkwitz-Riley crossovers
// of the fourth order (two Butterworth sections each for the low and the
// high half), in a tree: the first split takes the lowest band off the
// input, the next split the next band off what is left, and so on. A band
// split off early misses the phase turn of the later splits, so it passes an
// all-pass of each of them; then the bands sum to an all-pass of the input,
// flat in magnitude.
//
// The sections of a split, and the all-pass corrections of earlier bands,
// run side by side on every channel through the BiquadLanes kernel. Split
// points are used in ascending order, whatever the order of the parameters.
#pragma once

#include <array>
#include <cstdint>
#include <vector>

#include "../ZenAudioAlgorithm.h"
#include "Algorithms/BiquadLanes.h"

class LinkwitzRileyCrossover : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t { kBands, kFrequency1, kFrequency2, kFrequency3, kFrequency4 };

    static constexpr std::size_t kMaxBands = 5;
    static constexpr std::size_t kMaxSplits = kMaxBands - 1;
    static constexpr double kButterworthQ = 0.70710678118654752;
    // Split points are held below this share of the sample rate.
    static constexpr double kHighestShareOfRate = 0.45;

    LinkwitzRileyCrossover();

    static const zen::ParameterTableDefinition& Definitions();

    // Sizes the band buffers for the channel count and maxBlock, then the defaults.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    void SetChannelCount(std::uint64_t channels) override;
    bool SetParameter(std::uint64_t index, float value) override;
    void Reset() override;
    // In place: split, then the bands summed again (the all-pass of the
    // split), for a path that must stay in phase with processed bands.
    bool Process(float* const* channels, std::uint64_t count) override;

    // Every channel of `input` into the band buffers; at most the prepared
    // block. The input may be a band buffer of this crossover only if it is
    // the first band's.
    void Split(const float* const* input, std::uint64_t count) noexcept;
    // Band `band` (0 lowest) of every channel, as left by the last Split.
    float* const* Band(std::size_t band) const { return m_bandPointers.data() + band * GetChannelCount(); }
    std::size_t GetBandCount() const { return m_bandCount; }
    // The split points in use, ascending (Hz): GetBandCount() - 1 of them.
    double GetSplitFrequency(std::size_t split) const { return m_splits[split]; }

    // Second-order Butterworth sections at `frequency`, and the all-pass that
    // their low- and high-pass squares sum to.
    static ora::numeric::BiquadSection LowPass(double frequency, double sampleRate);
    static ora::numeric::BiquadSection HighPass(double frequency, double sampleRate);
    static ora::numeric::BiquadSection AllPass(double frequency, double sampleRate);

private:
    struct ChannelLanes {
        std::array<ora::numeric::BiquadLane, kMaxSplits> low, high;
        // Per band, the all-pass corrections, two to a lane.
        std::array<std::array<ora::numeric::BiquadLane, 2>, kMaxBands> allPass;
    };
    struct Stage {
        std::vector<ora::numeric::BiquadLane*> lanes;
        std::vector<float*> buffers;
    };

    void Rebuild();
    void ClearNonFinite() noexcept;

    ora::numeric::BiquadLanes m_kernel;
    std::vector<ChannelLanes> m_channels;
    std::array<Stage, kMaxSplits> m_stages;
    std::vector<float> m_buffer;        // band-major, then channel, maxBlock samples each
    std::vector<float*> m_bandPointers;  // [band][channel]
    std::vector<const float*> m_chunk;   // Process: the channels from an offset
    std::size_t m_bandCount = 2;
    std::array<double, kMaxSplits> m_splits{};
};
