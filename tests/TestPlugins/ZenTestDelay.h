// "Test Delay": a plug-in compiled only into the tests, never into the
// library. It delays every channel by "Delay" samples (its latency, fixed at
// Prepare) and applies a smoothed "Gain", so host code can be tested against
// a plug-in with latency. Up to two channels.
#pragma once

#include "Common/Algorithms/Delay.h"
#include "Common/SmoothedValueGroup.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenTestDelay : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;
    enum Parameter : std::uint32_t { kDelay, kGain, kMode };

    ZenTestDelay();
    static const zen::ParameterTableDefinition& Definitions();

    // Calls of UpdateProcessingParameter seen, for tests of the hand-over.
    int UpdatesSeen() const { return m_updates; }

protected:
    bool OnParameterChanged(std::uint32_t index, float value) override;
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlock) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    zen::Delay m_delay;
    zen::SmoothedValueGroup m_gain{kMaxChannels, 1.0f};
    int m_updates = 0;
};
