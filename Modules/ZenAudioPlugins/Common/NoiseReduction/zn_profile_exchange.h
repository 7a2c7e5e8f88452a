// Hands noise profiles from one thread to another without locks or waits:
// a triple buffer of snapshots. The writer fills Back() and publishes it;
// the reader takes the newest into Front(). A snapshot published again
// before the reader takes it is replaced by the newer one.
//
// One writer thread and one reader thread; Reserve while neither is busy.
#pragma once

#include <atomic>
#include <cstddef>

#include "zn_noise_profile.h"

namespace zen::noise_reduction {

class zn_profile_exchange {
public:
    // Room for `values` powers in every slot, so a writer on the audio
    // thread copies without allocating. Allocates.
    void Reserve(std::size_t values);

    zn_noise_profile::Snapshot& Back() { return m_slots[m_back]; }
    // Copies `snapshot` into Back() within its capacity; false (nothing
    // published) when it does not fit.
    bool PublishCopy(const zn_noise_profile::Snapshot& snapshot) noexcept;
    void Publish() noexcept;

    // True when a snapshot newer than Front() arrived; it is now Front().
    bool Take() noexcept;
    zn_noise_profile::Snapshot& Front() { return m_slots[m_front]; }

private:
    static constexpr unsigned kIndex = 3;
    static constexpr unsigned kFresh = 4;

    zn_noise_profile::Snapshot m_slots[3];
    std::atomic<unsigned> m_middle{1};
    unsigned m_back = 0;   // the writer's
    unsigned m_front = 2;  // the reader's
};

}  // namespace zen::noise_reduction
