// "Test Allocating": sizes a scratch vector inside processing, the
// allocation the validator must catch.
#pragma once

#include <vector>

#include "ZenFaultyGain.h"

class ZenTestAllocating : public ZenFaultyGain {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    ZenTestAllocating() : ZenFaultyGain(kDescriptor.className) {}

protected:
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;

private:
    std::vector<float> m_scratch;
};
