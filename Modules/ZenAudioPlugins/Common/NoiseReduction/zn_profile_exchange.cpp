#include "zn_profile_exchange.h"

namespace zen::noise_reduction {

void zn_profile_exchange::Reserve(std::size_t values) {
    for (auto& slot : m_slots) slot.power.reserve(values);
}

bool zn_profile_exchange::PublishCopy(const zn_noise_profile::Snapshot& snapshot) noexcept {
    zn_noise_profile::Snapshot& back = Back();
    if (snapshot.power.size() > back.power.capacity()) return false;
    back.power.assign(snapshot.power.begin(), snapshot.power.end());
    back.rate = snapshot.rate;
    back.bins = snapshot.bins;
    back.channels = snapshot.channels;
    Publish();
    return true;
}

void zn_profile_exchange::Publish() noexcept {
    m_back = m_middle.exchange(m_back | kFresh, std::memory_order_acq_rel) & kIndex;
}

bool zn_profile_exchange::Take() noexcept {
    if ((m_middle.load(std::memory_order_relaxed) & kFresh) == 0) return false;
    m_front = m_middle.exchange(m_front, std::memory_order_acq_rel) & kIndex;
    return true;
}

}  // namespace zen::noise_reduction
