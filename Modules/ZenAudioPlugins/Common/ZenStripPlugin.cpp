#include "ZenStripPlugin.h"

#include <algorithm>
#include <cmath>

void ZenStripPlugin::InitStrip(const Layout& layout) {
    m_layout = layout;
    m_ramps.resize(Parameters().GetCount());
    for (std::uint32_t p = 0; p < Parameters().GetCount(); ++p)
        if (Parameters()[p].Definition().IsSmoothed()) m_smoothed.push_back(p);
    m_alwaysOn.Hold(1.0f);
}

void ZenStripPlugin::AddStage(zen::StripStage& stage, std::uint32_t switchParameter) {
    m_stages.push_back(&stage);
    m_strip.Add(stage, switchParameter == kAlwaysOn ? m_alwaysOn : m_ramps[switchParameter]);
}

void ZenStripPlugin::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    const std::uint32_t channels = GetProcessChannelCount();
    for (zen::StripStage* stage : m_stages) {
        stage->Algorithm().SetChannelCount(channels);
        stage->Algorithm().Prepare(sampleRate, maxBlockSize);
    }
    ConfigureStages();
    // Every control reaches the freshly prepared algorithms at the first grid point.
    for (zen::SmoothedRamp& ramp : m_ramps) ramp.Prepare(maxBlockSize);
    m_strip.Prepare(channels, maxBlockSize);
    SetLatency(0);
    ResetProcessing();
}

void ZenStripPlugin::ResetProcessing() {
    for (zen::StripStage* stage : m_stages) stage->Algorithm().Reset();
    m_strip.Reset();
}

void ZenStripPlugin::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    for (std::uint32_t p : m_smoothed) m_ramps[p].Read(Smoothed(p), frames);

    for (std::uint32_t c = 0; c < channelCount; ++c) {
        float peak = 0.0f;
        for (std::uint32_t i = 0; i < frames; ++i) peak = std::max(peak, std::fabs(channels[c][i]));
        PublishMeter(m_layout.inputPeakMeter, c, peak);
    }

    m_strip.Process(channels, channelCount, frames, m_controls.Settled(m_ramps.data()),
                    [this](std::uint32_t i) { m_controls.Apply(m_ramps.data(), i); });

    const zen::SmoothedRamp& output = m_ramps[m_layout.outputGain];
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        float* y = channels[c];
        if (!output.IsConstant() || output[0] != 1.0f)
            for (std::uint32_t i = 0; i < frames; ++i) y[i] *= output[i];
        float peak = 0.0f;
        for (std::uint32_t i = 0; i < frames; ++i) peak = std::max(peak, std::fabs(y[i]));
        PublishMeter(m_layout.outputPeakMeter, c, peak);
    }
    PublishStageMeters();
}
