// "Test Delay": a plug-in compiled only into the tests, never into the
// library. It delays every channel by "Delay" samples (its latency, fixed at
// Prepare) and applies a smoothed "Gain" and a stepped "Mode" (inverted or
// not), so host code can be tested against a plug-in with latency. Up to two
// channels. Meters of every kind: each channel's output peak, the last
// samples of the first channel as an array, and every output frame as a
// point (first channel, last channel) in a ring.
#pragma once

#include <thread>

#include "Common/Algorithms/Delay.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenTestDelay : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;
    enum Parameter : std::uint32_t { kDelay, kGain, kMode };
    enum Meter : std::uint32_t { kOutputPeak, kLastSamples, kPoints };
    static constexpr std::uint32_t kLastSampleCount = 8;
    static constexpr std::uint32_t kPointCapacity = 256;

    ZenTestDelay();
    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    // For tests of the hand-over: calls of UpdateProcessingParameter, the
    // parameters they brought (one bit each) and the thread of the last one.
    int UpdatesSeen() const { return m_updates; }
    std::uint32_t ParametersUpdated() const { return m_updated; }
    std::thread::id UpdateThread() const { return m_updateThread; }

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlock) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    zen::Delay m_delay;
    float m_sign = 1.0f;  // audio thread
    int m_updates = 0;
    std::uint32_t m_updated = 0;
    std::thread::id m_updateThread;
};
