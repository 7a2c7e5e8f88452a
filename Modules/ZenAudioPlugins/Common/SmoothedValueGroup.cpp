#include "SmoothedValueGroup.h"

#include "GlobalSmoothing.h"
#include "OnePoleSmoother.h"

namespace zen {

SmoothedValueGroup::SmoothedValueGroup(std::size_t elementCount, float initialValue)
    : m_elements(new Element[elementCount]), m_size(elementCount), m_initialValue(initialValue) {
    for (std::size_t i = 0; i < m_size; ++i) {
        m_elements[i].target.store(initialValue);
        m_elements[i].current.store(initialValue);
    }
}

void SmoothedValueGroup::SetTarget(float value) {
    const bool ramp = GlobalSmoothing::IsRunning() && (m_processing == nullptr || m_processing->load());
    for (std::size_t i = 0; i < m_size; ++i) {
        m_elements[i].target.exchange(value);
        if (!ramp) m_elements[i].current.store(value);
    }
}

void SmoothedValueGroup::Settle() {
    for (std::size_t i = 0; i < m_size; ++i) m_elements[i].current.store(m_elements[i].target.load());
}

SmoothedValueGroup::Cursor SmoothedValueGroup::Track(std::size_t i) noexcept {
    const OnePoleSmoother& smoother = GlobalSmoothing::SharedSmoother();
    return Cursor(m_elements[i], smoother.GetA(), smoother.GetB());
}

}  // namespace zen
