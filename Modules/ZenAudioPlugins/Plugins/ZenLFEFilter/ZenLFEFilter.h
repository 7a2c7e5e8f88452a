// "LFE Filter": a steep low-pass for the LFE channel, Linkwitz-Riley or
// Butterworth, 24 or 48 dB per octave, from 40 to 200 Hz; every other channel
// passes bit for bit, with no latency.
//
// "Channel" says which channel is filtered: "Auto" takes the LFE of the
// layout (a mono instance is an LFE feed itself; 5.1, 6.1 and 7.1 in the
// WAV/SMPTE order and the immersive 5.1.4, 7.1.4 and 9.1.6 carry it
// fourth; other layouts have none), "All" every channel, or a channel by
// number. The cut-off glides when automated.
#pragma once

#include <array>
#include <memory>

#include "Common/Algorithms/BiQuad.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenLFEFilter : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kCutoff, kType, kSlope, kChannel };
    enum Type { kLinkwitzRiley, kButterworth };
    enum Slope { k24dB, k48dB };
    // Values of "Channel" before the channel numbers.
    enum Channel { kAuto, kAll, kFirstNumbered };
    // Row of the meter table: the output peak of the filtered channels.
    enum Meter : std::uint32_t { kLfePeak };

    static constexpr std::size_t kMaxSections = 4;
    // An automated cut-off is redesigned on this grid of samples.
    static constexpr std::uint32_t kGlideStep = 32;
    // The tail: the slowest pole's ringing falls by e^-kTailNepers.
    static constexpr double kTailNepers = 20.0;

    ZenLFEFilter();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    // The Q of each second-order section of a design (0 for a wire).
    static std::array<double, kMaxSections> SectionQs(Type type, Slope slope);
    // The channel "Auto" filters in a layout of `channels`, or -1.
    static int AutoChannel(std::uint32_t channels);

    std::uint32_t GetTailLength() const override;
    bool ApplyNeutralSetting() override;

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    void Design();
    void SetCutoff(float hertz) noexcept;
    bool Filters(std::uint32_t channel, std::uint32_t channelCount) const noexcept;
    void Filter(float* const* channels, std::uint32_t channelCount, std::uint32_t offset, std::uint32_t frames) noexcept;

    std::array<std::unique_ptr<BiQuad>, kMaxSections> m_sections;

    // Audio thread.
    Type m_type = kLinkwitzRiley;
    Slope m_slope = k24dB;
    int m_channel = kAuto;
    float m_cutoff = 0.0f;  // designed
    std::uint64_t m_position = 0;  // samples since Prepare, for the glide grid
};
