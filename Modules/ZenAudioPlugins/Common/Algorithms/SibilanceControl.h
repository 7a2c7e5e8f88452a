// Boost-and-compare sibilance detector and gain. A filtered copy of the input,
// with the sibilance band boosted, is tracked beside the input itself; the
// difference of the two peak envelopes (log units) is a wide-band gain. When
// the band dominates, the boost lifts the filtered envelope and the gain falls
// by about the boost; when it is quiet both envelopes agree and the gain is 1.
//
// One or two channels, detection linked. "Listen" cross-fades to the filtered
// band scaled back by its boost, so the user hears what is detected.
#pragma once

#include <atomic>
#include <cstdint>
#include <vector>

#include "../ZenAudioAlgorithm.h"
#include "Algorithms/Vec.h"
#include "BiQuad.h"
#include "LevelTracker.h"

class SibilanceControl : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t {
        kMode,  // the band's BiQuad "Shape"
        kFrequency,
        kGain,
        kQ,
        kAttack,
        kHold,
        kRelease,
        kFloor,
        kReaction,  // stored only
        kListen,
    };
    // Meter 0: the present gain change in dB (negative while reducing).
    enum Meter : std::uint64_t { kReductionMeter };
    static constexpr std::uint64_t kMaxChannels = 2;

    SibilanceControl();

    static const zen::ParameterTableDefinition& Definitions();

    // Prepares the band and both trackers, then applies this class's defaults.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    void SetChannelCount(std::uint64_t channels) override;
    bool SetParameter(std::uint64_t index, float value) override;
    void Reset() override;
    // False, buffers untouched, unless there are one or two channels. Blocks
    // longer than the prepared maximum are worked through in pieces.
    bool Process(float* const* channels, std::uint64_t count) override;
    float GetMeter(std::uint64_t index) const override;

    // The smoothed gain in log units.
    float GetGain() const { return m_gain; }
    // The detector band as designed now (for displays).
    const BiQuad::Coefficients& BandCoefficients() const { return m_band.GetCoefficients(); }

private:
    void ProcessPiece(float* const* channels, std::uint64_t channelCount, std::uint64_t count) noexcept;

    BiQuad m_band;
    LevelTracker m_inputLevel;
    LevelTracker m_bandLevel;
    std::vector<float> m_scratch;  // the filtered copy, kMaxChannels x m_scratchFrames
    std::uint64_t m_scratchFrames = 0;
    std::vector<float> m_gains;  // per sample of a piece
    ora::numeric::Vec m_vec;
    float m_gain = 0.0f;  // S, log units
    float m_dry = 1.0f;
    float m_listen = 0.0f;
    float m_bandGain = 1.0f;  // linear boost of the band, undone when listening
    std::atomic<float> m_reductionDb{0.0f};
};
