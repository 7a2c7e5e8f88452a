// The null device held to the audio clock: block n starts no earlier than
// n block periods after the start, so processing runs at the audio rate as
// behind a real interface. For soak tests: Start runs it on a thread of its
// own until Stop, counting blocks whose callback overran its period.
#pragma once

#include <atomic>
#include <thread>

#include "NullDevice.h"

namespace zen::host {

class ClockedNullDevice : public NullDevice {
public:
    explicit ClockedNullDevice(const DeviceFormat& format);
    ~ClockedNullDevice() override;

    std::string Name() const override { return "clocked"; }
    // Paced on the calling thread.
    std::uint64_t Run(AudioCallback& callback, std::uint64_t frames) override;

    // Runs on a thread of the device until Stop (or `frames`, 0 for no end).
    // Throws HostError when already running.
    void Start(AudioCallback& callback, std::uint64_t frames = 0);
    void Stop();
    bool IsRunning() const { return m_running.load(std::memory_order_acquire); }

    std::uint64_t BlocksRun() const { return m_blocks.load(std::memory_order_acquire); }
    // Blocks whose callback returned after the next block was due.
    std::uint64_t LateBlocks() const { return m_lateBlocks.load(std::memory_order_acquire); }

private:
    std::uint64_t Pace(AudioCallback& callback, std::uint64_t frames);

    std::thread m_thread;
    std::atomic<bool> m_stop{false};
    std::atomic<bool> m_running{false};
    std::atomic<std::uint64_t> m_blocks{0};
    std::atomic<std::uint64_t> m_lateBlocks{0};
};

}  // namespace zen::host
