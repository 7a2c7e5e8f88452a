// Tames plosive bursts: a low-passed copy of the input drives a Compressor as
// its sidechain, so only energy below the corner (the thump of a "p" or "b"
// on the microphone) pulls the gain down, while the voice above it leaves the
// detector cold. One or two channels, detection linked; no latency.
#pragma once

#include <cstdint>
#include <vector>

#include "../ZenAudioAlgorithm.h"
#include "BiQuad.h"
#include "Compressor.h"

class DePop : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t { kThreshold, kRatio, kFrequency, kAttack, kRelease };
    // Meter 0: the gain reduction of the last sample, in dB (<= 0).
    enum Meter : std::uint64_t { kGainReductionMeter };
    static constexpr std::uint64_t kMaxChannels = 2;

    DePop();

    static const zen::ParameterTableDefinition& Definitions();

    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    void SetChannelCount(std::uint64_t channels) override;
    bool SetParameter(std::uint64_t index, float value) override;
    void Reset() override;
    // False, buffers untouched, for more than two channels. Blocks longer
    // than the prepared maximum are worked through in pieces.
    bool Process(float* const* channels, std::uint64_t count) override;
    float GetMeter(std::uint64_t index) const override;

private:
    void SetUpDetector();

    BiQuad m_filter;
    Compressor m_compressor;
    std::vector<float> m_scratch;  // the filtered copy, kMaxChannels x m_scratchFrames
    std::uint64_t m_scratchFrames = 0;
};
