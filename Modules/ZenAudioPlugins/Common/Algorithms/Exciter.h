// Harmonic exciter: the band above "Frequency" is driven into a soft
// saturation curve, high-passed again (the curve's DC and the low products
// of its intermodulation go), scaled back by the drive and mixed under the
// signal. The curve is biased by "Even", so it adds even harmonics beside
// the odd ones. Any number of channels, each on its own; no latency.
//
//   y = x + mix * HP( (S(drive * HP(x) + b) - S(b)) / drive ),  b = kMaxBias * even
//
// S(u) = u (27 + u^2) / (27 + 9 u^2) for |u| < 3, and +-1 beyond: a rational
// tanh-like curve with unit slope at 0 that reaches +-1 with zero slope.
#pragma once

#include <algorithm>
#include <cstdint>
#include <vector>

#include "../ZenAudioAlgorithm.h"
#include "BiQuad.h"

class Exciter : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t { kFrequency, kDrive, kEven, kMix };
    static constexpr float kMaxBias = 0.5f;
    static constexpr std::uint64_t kMaxChannels = 8;

    Exciter();

    static const zen::ParameterTableDefinition& Definitions();

    // The saturation curve S; without branches, so that loops over it vectorise.
    static float Saturate(float u) noexcept {
        const float v = std::min(std::max(u, -3.0f), 3.0f);
        const float v2 = v * v;
        return v * (27.0f + v2) / (27.0f + 9.0f * v2);
    }

    // Defaults at the new rate, scratch for maxBlock, state cleared.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    void SetChannelCount(std::uint64_t channels) override;
    bool SetParameter(std::uint64_t index, float value) override;
    void Reset() override;
    // False, buffers untouched, for more than kMaxChannels channels. Blocks
    // longer than the prepared maximum are worked through in pieces.
    bool Process(float* const* channels, std::uint64_t count) override;

private:
    void ProcessPiece(float* const* channels, std::uint64_t channelCount, std::uint64_t count) noexcept;

    BiQuad m_band;  // what drives the curve
    BiQuad m_post;  // what of the curve's output is kept
    std::vector<float> m_scratch;  // channel-major, m_scratchFrames each
    std::uint64_t m_scratchFrames = 0;
    float m_drive = 1.0f;  // linear
    float m_bias = 0.0f;
    float m_mix = 0.0f;
};
