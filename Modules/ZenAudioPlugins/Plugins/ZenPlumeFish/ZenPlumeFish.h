// "Surround Analyzer": where a surround mix sits. Per channel its level,
// its loudness and its share of the programme's loudness; the image, the
// direction and spread of the energy vector of the channels' K-weighted
// powers on the loudspeakers of the layout (5.1 at +-30 and +-110 degrees,
// 7.1 with sides at +-90 and backs at +-135); and the correlation of the
// front pairs L/R, L/C and C/R. The audio passes untouched, latency 0.
//
// Levels and loudness are over 400 ms, correlations over "Time". The image
// reads 0 degrees and 0 spread for silence and for channel counts without a
// known layout; a correlation reads 0 where the layout lacks the pair.
#pragma once

#include "Common/Algorithms/CorrelationMeter.h"
#include "Common/Algorithms/LoudnessMeter.h"
#include "Common/Algorithms/SurroundImage.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenPlumeFish : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kLfeChannel, kTime };
    enum Pair : std::uint32_t { kLeftRight, kLeftCentre, kCentreRight, kPairs };
    enum Meter : std::uint32_t {
        kLoudness,
        kDirection,
        kSpread,
        kCorrelationLeftRight,  // then L/C and C/R, in Pair order
        kCorrelationLeftCentre,
        kCorrelationCentreRight,
        kLevel,            // per channel
        kChannelLoudness,  // per channel
        kShare,            // per channel
    };

    static constexpr float kSilenceLufs = -120.0f;

    ZenPlumeFish();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    void Configure() noexcept;

    LoudnessMeter m_loudness;
    CorrelationMeter m_pairs[kPairs];
    std::uint32_t m_pairChannels[kPairs][2] = {};
    bool m_hasPair[kPairs] = {};
    zen::SurroundImage m_image;
    float m_lfeChoice = 0.0f;
    double m_powers[kMaxChannels] = {};
};
