#include "ZenTestDelay.h"

#include <algorithm>
#include <cmath>

#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenTestDelay::kDescriptor = {
    "Test Delay", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 't', 'D', 'l'),
    2, 2, "ZenTestDelay", 0, 0, -1, nullptr};

ZenTestDelay::ZenTestDelay() {
    InitParameters(Definitions());
    InitMeters(Meters());
}

const zen::ParameterTableDefinition& ZenTestDelay::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "ZenTestDelay",
        {
            zen::ContinuousParameter("DELAY", "Delay", 0.0f, 4800.0f, 64.0f, 1.0f, "samples"),
            zen::ContinuousParameter("GAIN", "Gain", -24.0f, 12.0f, 0.0f, 0.1f, "dB").Smoothed(zen::working::DbToGain),
            zen::ListParameter("MODE", "Mode", {"Plain", "Inverted"}, 0.0f),
        });
    return table;
}

const zen::MeterTableDefinition& ZenTestDelay::Meters() {
    static const zen::MeterTableDefinition table = zen::MakeMeterTable(
        "ZenTestDelay", {
                            zen::LevelMeter("OUTPUT_PEAK", "Output Peak", "dBFS", -60.0f, 6.0f).PerChannel(),
                            zen::ArrayMeter("LAST_SAMPLES", "Last Samples", "", -1.0f, 1.0f, kLastSampleCount),
                            zen::RingMeter("POINTS", "Points", "", -1.0f, 1.0f, 2, kPointCapacity),
                        });
    return table;
}

void ZenTestDelay::UpdateProcessingParameter(std::uint32_t index, float value) {
    ++m_updates;
    m_updated |= 1u << index;
    m_updateThread = std::this_thread::get_id();
    if (index == kMode) m_sign = value >= 0.5f ? -1.0f : 1.0f;
}

void ZenTestDelay::PrepareProcessing(float, std::uint32_t maxBlock) {
    const auto delay = static_cast<std::uint32_t>(GetParameter(kDelay));
    m_delay.Dimension(GetProcessChannelCount(), maxBlock, delay);
    SetLatency(delay);
}

void ZenTestDelay::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        auto gain = Smoothed(kGain).Track(c);
        m_delay.ProcessChannel(c, channels[c], frames);
        float peak = 0.0f;
        for (std::uint32_t i = 0; i < frames; ++i) {
            channels[c][i] *= m_sign * static_cast<float>(gain.Next());
            peak = std::max(peak, std::fabs(channels[c][i]));
        }
        PublishMeter(kOutputPeak, c, peak);
    }
    float last[kLastSampleCount] = {};
    const std::uint32_t count = std::min(frames, kLastSampleCount);
    std::copy_n(channels[0] + frames - count, count, last);
    PublishArray(kLastSamples, 0, last);
    for (std::uint32_t i = 0; i < frames; ++i) {
        const float point[2] = {channels[0][i], channels[channelCount - 1][i]};
        PushRing(kPoints, 0, point);
    }
}

void ZenTestDelay::ResetProcessing() { m_delay.Reset(); }

template class ZenAudioPlugin<ZenTestDelay>;
