#include "SmoothedRamp.h"

namespace zen {

void SmoothedRamp::Prepare(std::uint32_t maxBlock) {
    m_values.assign(maxBlock, 0.0f);
    Forget();
}

void SmoothedRamp::Forget() noexcept { m_handed = std::numeric_limits<float>::quiet_NaN(); }

void SmoothedRamp::Read(SmoothedValueGroup& group, std::uint32_t frames, std::size_t element) noexcept {
    SmoothedValueGroup::Element& e = group[element];
    const float target = e.target.load(std::memory_order_relaxed);
    m_constant = e.current.load(std::memory_order_relaxed) == static_cast<double>(target) || frames > m_values.size();
    if (m_constant) {
        // A block beyond the buffer (never from the plug-in base, which splits
        // at the prepared size) takes the target at once.
        e.current.store(target, std::memory_order_relaxed);
        m_value = target;
        return;
    }
    auto cursor = group.Track(element);
    for (std::uint32_t i = 0; i < frames; ++i) m_values[i] = static_cast<float>(cursor.Next());
}

bool SmoothedRamp::Holds(float value, std::uint32_t from, std::uint32_t count) const noexcept {
    if (m_constant) return m_value == value;
    for (std::uint32_t i = from; i < from + count; ++i)
        if (m_values[i] != value) return false;
    return true;
}

}  // namespace zen
