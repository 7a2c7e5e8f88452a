// "Test Racy": hands "Gain" to the audio thread through a plain float, a data
// race that only ThreadSanitizer sees.
#pragma once

#include "ZenFaultyGain.h"

class ZenTestRacy : public ZenFaultyGain {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    ZenTestRacy() : ZenFaultyGain(kDescriptor.className) {}

protected:
    bool OnParameterChanged(std::uint32_t index, float value) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;

private:
    float m_plainGain = 1.0f;
};
