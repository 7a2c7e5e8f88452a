// "Test Wrong Latency": delays by 32 samples and reports 40.
#pragma once

#include "Common/Algorithms/Delay.h"
#include "ZenFaultyGain.h"

class ZenTestWrongLatency : public ZenFaultyGain {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    ZenTestWrongLatency() : ZenFaultyGain(kDescriptor.className) {}
    static constexpr std::uint32_t kDelay = 32;
    static constexpr std::uint32_t kReported = 40;

protected:
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlock) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    zen::Delay m_delay;
};
