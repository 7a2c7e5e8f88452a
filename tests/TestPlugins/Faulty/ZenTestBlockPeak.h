// "Test Block Peak": a naive limiter whose gain comes from each block's
// peak, so its output depends on the host's block split, and which does not
// declare itself block-based.
#pragma once

#include "ZenFaultyGain.h"

class ZenTestBlockPeak : public ZenFaultyGain {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;
    static constexpr float kCeiling = 0.25f;

    ZenTestBlockPeak() : ZenFaultyGain(kDescriptor.className) {}

protected:
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
};
