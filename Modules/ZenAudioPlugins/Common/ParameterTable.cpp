#include "ParameterTable.h"

#include <cmath>

namespace zen {

void ParameterTable::Build(const ParameterTableDefinition& definitions) {
    m_count = static_cast<std::uint32_t>(definitions.size());
    m_records.reset(new PluginParameter[m_count]);
    for (std::uint32_t i = 0; i < m_count; ++i) m_records[i].Init(definitions[i]);
}

void ParameterTable::Store(std::uint32_t index, float value) {
    m_records[index].Exchange(value);
    m_changes.fetch_add(1, std::memory_order_acq_rel);
}

void ParameterTable::MarkLoaded() {
    for (std::uint32_t i = 0; i < m_count; ++i) m_records[i].MarkChanged();
    m_changes.fetch_add(1, std::memory_order_acq_rel);
    m_loads.fetch_add(1, std::memory_order_acq_rel);
}

std::int32_t ParameterTable::Find(const QString& identifierOrLabel) const {
    for (std::uint32_t i = 0; i < m_count; ++i)
        if (m_records[i].Definition().identifier == identifierOrLabel) return static_cast<std::int32_t>(i);
    for (std::uint32_t i = 0; i < m_count; ++i)
        if (m_records[i].Definition().label == identifierOrLabel) return static_cast<std::int32_t>(i);
    return -1;
}

void ParameterTable::RefreshPositions() {
    for (std::uint32_t i = 0; i < m_count; ++i) m_records[i].RefreshPosition();
}

QJsonObject ParameterTable::ToJson() const {
    QJsonObject values;
    for (std::uint32_t i = 0; i < m_count; ++i)
        values.insert(m_records[i].Definition().identifier, static_cast<double>(m_records[i].GetValue()));
    return values;
}

bool ParameterTable::FromJson(const QJsonObject& values, std::vector<std::pair<std::uint32_t, float>>& out) const {
    out.clear();
    for (std::uint32_t i = 0; i < m_count; ++i) {
        const auto it = values.constFind(m_records[i].Definition().identifier);
        if (it == values.constEnd()) continue;
        if (!it->isDouble() || !std::isfinite(it->toDouble())) return false;
        out.emplace_back(i, static_cast<float>(it->toDouble()));
    }
    return true;
}

}  // namespace zen
