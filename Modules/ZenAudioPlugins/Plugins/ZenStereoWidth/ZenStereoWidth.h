// "Stereo Width": mid/side width from 0 % (mono) through 100 % (untouched,
// bit for bit) to 200 % (side doubled), with the bass optionally kept mono
// below a chosen frequency, and the output's correlation as a mono
// compatibility meter.
//
// Mono bass runs mid and side through a two-band Linkwitz-Riley crossover:
// mid keeps both bands (an all-pass of itself), side keeps only its upper
// band, so the lows of left and right become one and the rest sums flat.
// Switching it cross-fades between the two.
#pragma once

#include <vector>

#include "Algorithms/LR2MS.h"
#include "Algorithms/MS2LR.h"
#include "Common/Algorithms/CorrelationMeter.h"
#include "Common/Algorithms/LinkwitzRileyCrossover.h"
#include "Common/Algorithms/SwitchFade.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenStereoWidth : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kWidth, kMonoBass, kMonoBassFrequency };
    // Row of the meter table: the output's correlation (+1 mono, -1 cancels in mono).
    enum Meter : std::uint32_t { kCorrelation };

    // The crossover rings longest at its lowest setting: e^-kTailNepers.
    static constexpr double kTailNepers = 20.0;

    ZenStereoWidth();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    // One frame at width w (a fraction: 1 is 100 %). Below 1 mid and side are
    // rebuilt, so 0 gives left == right exactly; from 1 up the side is added
    // to the channels as they are, so 1 leaves them bit for bit.
    static void Widen(float& left, float& right, float w) noexcept {
        if (w < 1.0f) {
            const float mid = left * 0.5f + right * 0.5f;
            const float side = (left * 0.5f - right * 0.5f) * w;
            left = mid + side;
            right = mid - side;
        } else {
            const float extra = (left * 0.5f - right * 0.5f) * (w - 1.0f);
            left += extra;
            right -= extra;
        }
    }

    std::uint32_t GetTailLength() const override;
    bool ApplyNeutralSetting() override;

protected:
    bool AcceptsChannelConfiguration(std::uint32_t inputs, std::uint32_t outputs) const override;
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    // `width` holds the block's widths, or only its first when `settled`.
    void ProcessPlain(float* left, float* right, const float* width, bool settled, std::uint32_t frames) noexcept;
    void ProcessMonoBass(float* left, float* right, const float* width, bool settled, std::uint32_t frames) noexcept;

    ora::numeric::LR2MS m_toMidSide;
    ora::numeric::MS2LR m_toLeftRight;
    LinkwitzRileyCrossover m_crossover;
    CorrelationMeter m_correlation;
    std::vector<float> m_mid, m_side;
    std::vector<float> m_width;
    // The other mode's output while a switch fades.
    std::vector<float> m_fadingLeft, m_fadingRight;
    SwitchFade m_fade;

    // Audio thread.
    bool m_monoBass = false;
    bool m_fresh = true;  // no audio since the last reset
};
