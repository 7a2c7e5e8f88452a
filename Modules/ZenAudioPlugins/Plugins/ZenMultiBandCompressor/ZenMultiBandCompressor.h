// "Multiband Compressor": up to five bands split by Linkwitz-Riley crossovers
// of the fourth order whose sum is flat, each band compressed by its own
// soft-knee peak compressor, soloed or bypassed, and summed again.
//
// Channels: with "Side-Chain" off, every channel (1 to 10) is compressed,
// detection linked across them. With it on, the first ceil(n/2) channels are
// compressed and the last floor(n/2) are the key: each band listens to the
// same band of the key, and the key channels leave unchanged. So 2 channels
// are stereo (or, keyed, mono and its key), 3 stereo and a mono key, 4
// stereo and a stereo key, 10 five channels and five keys.
//
// "Lookahead" delays the bands the compressors act on, not what they listen
// to; it sets the latency, so it takes effect when the plug-in is next
// prepared. Threshold, ratio, knee, makeup, crossover frequencies and output
// glide when automated; solo and bypass switch with a short fade.
#pragma once

#include <array>
#include <vector>

#include "Common/Algorithms/Delay.h"
#include "Common/Algorithms/LinkwitzRileyCrossover.h"
#include "Common/Algorithms/SoftKneeCompressor.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenMultiBandCompressor : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    static constexpr std::uint32_t kMaxBands = LinkwitzRileyCrossover::kMaxBands;
    static constexpr std::uint32_t kMaxSplits = LinkwitzRileyCrossover::kMaxSplits;

    enum Parameter : std::uint32_t {
        kBands,
        kCrossover1,
        kSideChain = kCrossover1 + kMaxSplits,
        kLookahead,
        kOutput,
        kFirstBandParameter  // then kBandParameterCount rows per band
    };
    enum BandParameter : std::uint32_t {
        kThreshold,
        kRatio,
        kAttack,
        kRelease,
        kKnee,
        kMakeup,
        kSolo,
        kBypass,
        kBandParameterCount
    };
    // Rows of the meter table: each band's gain reduction (dB, <= 0), then
    // each channel's input and output peak.
    enum Meter : std::uint32_t { kGainReduction1, kInputPeak = kGainReduction1 + kMaxBands, kOutputPeak };

    static constexpr float kMaxLookaheadMs = 10.0f;
    // Solo and bypass fade over this time.
    static constexpr double kSwitchFadeSeconds = 0.01;
    // Automated crossover frequencies are redesigned on this grid of samples.
    static constexpr std::uint32_t kGlideStep = 32;
    // The tail: the lowest split's ringing falls by e^-kTailNepers.
    static constexpr double kTailNepers = 20.0;

    static constexpr std::uint32_t Index(std::uint32_t band, BandParameter p) {
        return kFirstBandParameter + band * kBandParameterCount + p;
    }
    // Key channels of a layout of `channels` (the rest are compressed).
    static std::uint32_t KeyChannels(std::uint32_t channels, bool sideChain) { return sideChain ? channels / 2 : 0; }

    ZenMultiBandCompressor();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    std::uint32_t GetTailLength() const override;
    bool ApplyNeutralSetting() override;

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    bool AcceptsChannelConfiguration(std::uint32_t inputs, std::uint32_t outputs) const override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    // A linear fade between 0 and 1.
    struct Fade {
        float value = 1.0f;
        float target = 1.0f;
        bool Settled() const { return value == target; }
    };

    void UpdateFadeTargets();
    // A band's law as the smoothed values stand now.
    SoftKneeCompressor::Law CurrentLaw(std::uint32_t band) noexcept;
    void FillLaws(std::uint32_t frames) noexcept;
    void DesignSplits(const float* frequencies) noexcept;
    void ProcessSpan(float* const* channels, std::uint32_t channelCount, std::uint32_t offset,
                     std::uint32_t frames) noexcept;
    void ApplyFades(std::uint32_t band, float* gains, std::uint32_t frames) noexcept;

    LinkwitzRileyCrossover m_crossover;
    std::array<SoftKneeCompressor, kMaxBands> m_compressors;
    zen::Delay m_lookahead;  // band-major, every channel

    // Audio thread.
    std::uint32_t m_bands = 1;
    bool m_sideChain = false;
    std::array<bool, kMaxBands> m_solo{};
    std::array<bool, kMaxBands> m_bypass{};
    std::array<Fade, kMaxBands> m_audible;  // 0 while another band is soloed
    std::array<Fade, kMaxBands> m_bypassed;  // 1 passes the band as it is
    float m_fadeStep = 1.0f;
    bool m_settleFades = true;
    std::array<float, kMaxSplits> m_designed{};  // split frequencies in the crossover
    std::uint64_t m_position = 0;  // samples since Prepare, for the glide grid

    // Per band, per sample of a block; only the first while the law holds still.
    std::vector<std::vector<SoftKneeCompressor::Law>> m_laws;
    std::array<bool, kMaxBands> m_lawSettled{};
    bool m_outputSettled = true;
    std::vector<std::vector<float>> m_gains;  // per band, per sample of a span
    std::vector<float> m_outputGain;          // per sample of a block, or the first alone
    std::vector<const float*> m_detectors;
    std::vector<const float*> m_spanInput;
};
