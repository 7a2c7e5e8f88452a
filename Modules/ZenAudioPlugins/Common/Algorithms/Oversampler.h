// Runs a non-linear stage at a multiple of the host's rate, so that the
// harmonics it makes above the host's Nyquist frequency are filtered away
// instead of folding back into the audio band. Per channel: Up() interpolates
// a block into the channel's high-rate buffer, the owner processes that
// buffer in place, Down() decimates it back.
//
// Both directions use linear-phase Kaiser low-passes, flat (within
// 0.001 dB) up to kPassbandEdge of the base rate and kStopbandDb down, in
// two stages above twice the base rate: the sharp filters run at twice the
// base rate, and a short one with a wide transition makes up the rest of
// the factor, which costs a third of one sharp filter at the full rate.
// The sharp decimator stops from the base Nyquist frequency on, so that
// nothing the stage makes above the host's band folds back louder than
// kStopbandDb; the sharp interpolator from kImageStopbandEdge on, where the
// images of the pass band begin (what the input holds between the pass band
// and Nyquist frequency is imaged less), which halves its length. The wide
// stages stop where their images and aliases would reach those bands, and
// kWideStopbandDb down: a hard-driven curve amplifies what the interpolator
// leaves, and it costs them little. The
// round trip delays by a whole number of base-rate samples, GetLatency(),
// counting the stage's own delay of a half or a whole high-rate sample (an
// antiderivative shaper).
//
// Construction and Prepare allocate; Up, Down and Reset do not (audio thread).
#pragma once

#include <cstdint>
#include <memory>
#include <vector>

#include "../ZenAudioAlgorithm.h"
#include "Algorithms/Downsampler.h"
#include "Algorithms/Upsampler.h"
#include "System/AlignedBuffer.h"

class Oversampler : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    static constexpr std::size_t kDefaultFactor = 4;
    static constexpr double kPassbandEdge = 0.42;  // of the base rate: 20.2 kHz at 48 kHz
    static constexpr double kStopbandEdge = 0.5;   // of the base rate
    static constexpr double kImageStopbandEdge = 1.0 - kPassbandEdge;
    static constexpr double kStopbandDb = 90.0;
    static constexpr double kWideStopbandDb = 100.0;

    // `factor` 2, 4 or 8; `stageHalfSamples` (0, 1 or 2): how far the owner's
    // stage delays, in half high-rate samples; the filters make up the rest.
    explicit Oversampler(std::size_t factor = kDefaultFactor, std::size_t stageHalfSamples = 0);
    ~Oversampler() override;

    // Builds the filters for the channel count and maxBlock base-rate frames.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    void SetChannelCount(std::uint64_t channels) override;
    void Reset() override;
    // The round trip alone: the input low-passed and delayed by GetLatency()
    // (less the stage's delay).
    bool Process(float* const* channels, std::uint64_t count) override;

    // `frames` base-rate samples (at most the prepared block) into the
    // channel's high-rate buffer, which is returned: GetFactor() x frames.
    float* Up(std::uint64_t channel, const float* in, std::uint64_t frames) noexcept;
    // The channel's high-rate buffer, as the owner left it, back to `frames`
    // base-rate samples. `out` may be the block given to Up().
    void Down(std::uint64_t channel, float* out, std::uint64_t frames) noexcept;

    std::size_t GetFactor() const { return m_factor; }
    // Round-trip delay in base-rate samples, the stage's included.
    std::uint32_t GetLatency() const;

    // Prototype lengths of the four filters, each at its own rate.
    struct Lengths {
        std::size_t sharpUp = 0, wideUp = 1, wideDown = 1, sharpDown = 0;
    };
    // The shortest lengths that meet the stop band and leave the round trip
    // on whole base-rate samples.
    static Lengths Design(std::size_t factor, std::size_t stageHalfSamples);

private:
    struct Channel {
        std::unique_ptr<ora::numeric::Upsampler> sharpUp, wideUp;
        std::unique_ptr<ora::numeric::Downsampler> wideDown, sharpDown;
        ora::AlignedBuffer<float> middle;  // twice the base rate, between the stages
        ora::AlignedBuffer<float> high;
    };

    static Lengths Search(std::size_t factor, std::size_t stageHalfSamples);
    // Round-trip delay in half high-rate samples.
    static std::size_t DelayHalfSamples(std::size_t factor, std::size_t stageHalfSamples, const Lengths& lengths);

    const std::size_t m_factor;
    const std::size_t m_wideFactor;  // the wide stages' share of the factor (1: no wide stages)
    const std::size_t m_stageHalfSamples;
    const Lengths m_lengths;
    std::vector<Channel> m_channels;
};
