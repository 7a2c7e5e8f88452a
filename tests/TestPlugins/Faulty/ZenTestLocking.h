// "Test Locking": takes a mutex in every block and does not declare it.
#pragma once

#include <mutex>

#include "ZenFaultyGain.h"

class ZenTestLocking : public ZenFaultyGain {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    ZenTestLocking() : ZenFaultyGain(kDescriptor.className) {}

protected:
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;

private:
    std::mutex m_mutex;
};
