#include "ParameterWatcher.h"

namespace zen {

ParameterWatcher::ParameterWatcher(const ParameterTable& parameters, QObject* parent)
    : QObject(parent),
      m_parameters(parameters),
      m_timer(this),
      m_seenChanges(parameters.GetChangeCount()),
      m_seenLoads(parameters.GetLoadCount()),
      m_seen(parameters.GetCount()) {
    for (std::uint32_t i = 0; i < parameters.GetCount(); ++i) m_seen[i] = parameters[i].GetChangeCount();
    connect(&m_timer, &QTimer::timeout, this, &ParameterWatcher::Poll);
    m_timer.start(kPollIntervalMs);
}

void ParameterWatcher::Poll() {
    const std::uint64_t changes = m_parameters.GetChangeCount();
    if (changes != m_seenChanges) {
        m_seenChanges = changes;
        for (std::uint32_t i = 0; i < m_parameters.GetCount(); ++i) {
            const std::uint32_t count = m_parameters[i].GetChangeCount();
            if (count == m_seen[i]) continue;
            m_seen[i] = count;
            emit ParameterChanged(static_cast<int>(i), m_parameters[i].GetValue());
        }
    }
    const std::uint64_t loads = m_parameters.GetLoadCount();
    if (loads != m_seenLoads) {
        m_seenLoads = loads;
        emit StateLoaded();
    }
}

}  // namespace zen
