#include "ClockedNullDevice.h"

#include <algorithm>
#include <chrono>
#include <limits>

#include "HostCore/HostError.h"

namespace zen::host {

ClockedNullDevice::ClockedNullDevice(const DeviceFormat& format) : NullDevice(format) {}

ClockedNullDevice::~ClockedNullDevice() { Stop(); }

std::uint64_t ClockedNullDevice::Pace(AudioCallback& callback, std::uint64_t frames) {
    using Clock = std::chrono::steady_clock;
    const Clock::time_point start = Clock::now();
    const double rate = m_format.sampleRate;
    std::uint64_t done = 0;
    // Deadlines from the frame count, so rounding never drifts.
    auto due = [&](std::uint64_t frame) {
        return start + std::chrono::duration_cast<Clock::duration>(std::chrono::duration<double>(frame / rate));
    };
    while (done < frames && !m_stop.load(std::memory_order_acquire)) {
        const auto n = static_cast<std::uint32_t>(std::min<std::uint64_t>(m_format.blockSize, frames - done));
        std::this_thread::sleep_until(due(done));
        RunBlock(callback, n);
        done += n;
        m_blocks.fetch_add(1, std::memory_order_acq_rel);
        if (Clock::now() > due(done)) m_lateBlocks.fetch_add(1, std::memory_order_acq_rel);
    }
    return done;
}

std::uint64_t ClockedNullDevice::Run(AudioCallback& callback, std::uint64_t frames) {
    if (IsRunning()) throw HostError("the clocked null device is already running");
    m_stop.store(false, std::memory_order_release);
    return Pace(callback, frames);
}

void ClockedNullDevice::Start(AudioCallback& callback, std::uint64_t frames) {
    if (IsRunning()) throw HostError("the clocked null device is already running");
    if (m_thread.joinable()) m_thread.join();
    m_stop.store(false, std::memory_order_release);
    m_running.store(true, std::memory_order_release);
    const std::uint64_t limit = frames == 0 ? std::numeric_limits<std::uint64_t>::max() : frames;
    m_thread = std::thread([this, &callback, limit] {
        Pace(callback, limit);
        m_running.store(false, std::memory_order_release);
    });
}

void ClockedNullDevice::Stop() {
    m_stop.store(true, std::memory_order_release);
    if (m_thread.joinable()) m_thread.join();
}

}  // namespace zen::host
