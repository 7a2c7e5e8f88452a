// "Test NaN State": a one-pole smoother by "Smoothing" whose state keeps a
// NaN or an infinity forever (0 times NaN is NaN, even with no smoothing).
#pragma once

#include "ZenFaultyGain.h"

class ZenTestNanState : public ZenFaultyGain {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    ZenTestNanState() : ZenFaultyGain(kDescriptor.className) {}

protected:
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    float m_state[kMaxChannels] = {};
};
