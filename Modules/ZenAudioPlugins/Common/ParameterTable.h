// The parameter records of one plug-in instance, in index order, built from
// the class's shared definitions; plus the text form of their values, and the
// counts through which editors notice changes without a lock or a signal.
#pragma once

#include <QJsonObject>
#include <QString>
#include <atomic>
#include <cstdint>
#include <memory>
#include <utility>
#include <vector>

#include "ParameterDefinition.h"
#include "PluginParameter.h"

namespace zen {

class ParameterTable {
public:
    ParameterTable() = default;
    ParameterTable(const ParameterTable&) = delete;
    ParameterTable& operator=(const ParameterTable&) = delete;

    void Build(const ParameterTableDefinition& definitions);

    std::uint32_t GetCount() const { return m_count; }
    bool Contains(std::uint64_t index) const { return index < m_count; }
    PluginParameter& operator[](std::uint64_t index) { return m_records[index]; }
    const PluginParameter& operator[](std::uint64_t index) const { return m_records[index]; }

    // Exchanges the value of a valid index and counts the change. Any thread;
    // lock-free, never allocates.
    void Store(std::uint32_t index, float value);

    // Changes of any parameter so far, and states loaded so far. Any thread.
    std::uint64_t GetChangeCount() const { return m_changes.load(std::memory_order_acquire); }
    std::uint64_t GetLoadCount() const { return m_loads.load(std::memory_order_acquire); }
    // After a state or preset was loaded: every parameter counts as changed.
    void MarkLoaded();

    // Index by identifier, or by label when no identifier matches; -1 if none.
    std::int32_t Find(const QString& identifierOrLabel) const;

    void RefreshPositions();

    // identifier -> value of every parameter.
    QJsonObject ToJson() const;
    // The (index, value) pairs named in a JSON object; unknown identifiers are
    // skipped. False when a known identifier has no finite number.
    bool FromJson(const QJsonObject& values, std::vector<std::pair<std::uint32_t, float>>& out) const;

private:
    std::unique_ptr<PluginParameter[]> m_records;
    std::uint32_t m_count = 0;
    std::atomic<std::uint64_t> m_changes{0};
    std::atomic<std::uint64_t> m_loads{0};
};

}  // namespace zen
