#include "MeterTable.h"

#include <algorithm>

namespace zen {

namespace {

bool IsScalar(const MeterDefinition& d) { return d.kind == MeterKind::Level || d.kind == MeterKind::Value; }

}  // namespace

void MeterTable::Build(const MeterTableDefinition& rows, std::uint32_t maxChannels) {
    m_maxChannels = maxChannels;
    m_rows.clear();
    std::uint32_t scalars = 0;
    for (const MeterDefinition& d : rows) {
        Row row;
        row.definition = &d;
        row.scalarOffset = scalars;
        m_rows.push_back(row);
        if (IsScalar(d)) scalars += Width(row);
    }
    m_scalars.reset(new std::atomic<float>[scalars]);
    m_arrays.clear();
    m_rings.clear();
    m_allocatedChannels = 0;
    Rest();
}

std::uint32_t MeterTable::Width(const Row& row) const { return row.definition->perChannel ? m_maxChannels : 1; }

void MeterTable::Allocate(std::uint32_t channels) {
    channels = std::min(channels, m_maxChannels);
    m_arrays.clear();
    m_rings.clear();
    for (Row& row : m_rows) {
        const MeterDefinition& d = *row.definition;
        const std::uint32_t count = d.perChannel ? channels : 1;
        if (d.kind == MeterKind::Array) {
            row.storageOffset = static_cast<std::uint32_t>(m_arrays.size());
            for (std::uint32_t c = 0; c < count; ++c) m_arrays.push_back(std::make_unique<MeterArray>(d.size));
        } else if (d.kind == MeterKind::Ring) {
            row.storageOffset = static_cast<std::uint32_t>(m_rings.size());
            for (std::uint32_t c = 0; c < count; ++c)
                m_rings.push_back(std::make_unique<MeterRing>(d.size, d.capacity));
        }
    }
    m_allocatedChannels = channels;
    Rest();
}

std::uint32_t MeterTable::GetCount(std::uint32_t channels) const {
    std::uint32_t count = 0;
    for (const Row& row : m_rows) count += row.definition->perChannel ? channels : 1;
    return count;
}

bool MeterTable::Locate(std::uint32_t index, std::uint32_t channels, std::uint32_t& row,
                        std::uint32_t& channel) const {
    for (std::uint32_t first = 0; first < m_rows.size();) {
        // A run of per-channel rows expands channel by channel.
        std::uint32_t end = first + 1;
        if (m_rows[first].definition->perChannel)
            while (end < m_rows.size() && m_rows[end].definition->perChannel) ++end;
        const std::uint32_t rows = end - first;
        const std::uint32_t count = m_rows[first].definition->perChannel ? rows * channels : 1;
        if (index < count) {
            row = first + index % rows;
            channel = index / rows;
            return true;
        }
        index -= count;
        first = end;
    }
    return false;
}

bool MeterTable::GetInfo(std::uint32_t index, std::uint32_t channels, MeterInfo& info) const {
    std::uint32_t row = 0, channel = 0;
    if (!Locate(index, channels, row, channel)) return false;
    const MeterDefinition& d = *m_rows[row].definition;
    info.identifier = d.identifier.toStdString();
    info.name = d.name.toStdString();
    if (d.perChannel) {
        info.identifier += "_" + std::to_string(channel + 1);
        info.name += " " + std::to_string(channel + 1);
    }
    info.unit = d.unit.toStdString();
    info.minimum = d.minimum;
    info.maximum = d.maximum;
    info.kind = d.kind;
    info.size = d.size;
    info.capacity = d.capacity;
    return true;
}

float MeterTable::Read(std::uint32_t index, std::uint32_t channels) const {
    std::uint32_t row = 0, channel = 0;
    if (!Locate(index, channels, row, channel)) return 0.0f;
    const Row& r = m_rows[row];
    if (!IsScalar(*r.definition) || channel >= Width(r)) return 0.0f;
    return r.definition->Reading(m_scalars[r.scalarOffset + channel].load(std::memory_order_relaxed));
}

MeterArray* MeterTable::ArrayAt(std::uint32_t row, std::uint32_t channel) const {
    const Row& r = m_rows[row];
    const std::uint32_t count = r.definition->perChannel ? m_allocatedChannels : 1;
    if (r.definition->kind != MeterKind::Array || channel >= count || m_allocatedChannels == 0) return nullptr;
    return m_arrays[r.storageOffset + channel].get();
}

MeterRing* MeterTable::RingAt(std::uint32_t row, std::uint32_t channel) const {
    const Row& r = m_rows[row];
    const std::uint32_t count = r.definition->perChannel ? m_allocatedChannels : 1;
    if (r.definition->kind != MeterKind::Ring || channel >= count || m_allocatedChannels == 0) return nullptr;
    return m_rings[r.storageOffset + channel].get();
}

bool MeterTable::ReadArray(std::uint32_t index, std::uint32_t channels, float* values, std::uint32_t count) const {
    std::uint32_t row = 0, channel = 0;
    if (values == nullptr || !Locate(index, channels, row, channel)) return false;
    const MeterArray* array = ArrayAt(row, channel);
    return array != nullptr && count >= array->GetSize() && array->Read(values);
}

MeterRingRead MeterTable::ReadRing(std::uint32_t index, std::uint32_t channels, std::uint64_t& cursor,
                                   float* records, std::uint32_t maxRecords) const {
    std::uint32_t row = 0, channel = 0;
    if (records == nullptr || !Locate(index, channels, row, channel)) return {};
    const MeterRing* ring = RingAt(row, channel);
    return ring != nullptr ? ring->Read(cursor, records, maxRecords) : MeterRingRead{};
}

void MeterTable::Publish(std::uint32_t row, std::uint32_t channel, float value) noexcept {
    if (row >= m_rows.size()) return;
    const Row& r = m_rows[row];
    if (!IsScalar(*r.definition) || channel >= Width(r)) return;
    m_scalars[r.scalarOffset + channel].store(value, std::memory_order_relaxed);
}

void MeterTable::PublishArray(std::uint32_t row, std::uint32_t channel, const float* values) noexcept {
    if (row >= m_rows.size()) return;
    if (MeterArray* array = ArrayAt(row, channel)) array->Publish(values);
}

void MeterTable::PushRing(std::uint32_t row, std::uint32_t channel, const float* record) noexcept {
    if (row >= m_rows.size()) return;
    if (MeterRing* ring = RingAt(row, channel)) ring->Push(record);
}

void MeterTable::Rest() noexcept {
    for (const Row& r : m_rows) {
        const MeterDefinition& d = *r.definition;
        if (IsScalar(d)) {
            for (std::uint32_t c = 0; c < Width(r); ++c)
                m_scalars[r.scalarOffset + c].store(d.restValue, std::memory_order_relaxed);
        } else if (d.kind == MeterKind::Array && m_allocatedChannels > 0) {
            const std::uint32_t count = d.perChannel ? m_allocatedChannels : 1;
            for (std::uint32_t c = 0; c < count; ++c) m_arrays[r.storageOffset + c]->Fill(d.restValue);
        }
    }
}

}  // namespace zen
