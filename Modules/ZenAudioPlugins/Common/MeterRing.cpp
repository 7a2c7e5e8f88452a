#include "MeterRing.h"

#include <algorithm>

namespace zen {

MeterRing::MeterRing(std::uint32_t recordWidth, std::uint32_t capacity)
    : m_width(recordWidth), m_capacity(capacity) {
    const std::size_t size = std::size_t{m_width} * m_capacity;
    m_values.reset(new std::atomic<float>[size]);
    for (std::size_t i = 0; i < size; ++i) m_values[i].store(0.0f, std::memory_order_relaxed);
}

void MeterRing::Push(const float* record) noexcept {
    const std::uint64_t index = m_written.load(std::memory_order_relaxed);
    // A reader that copied any value of this record (stored with release,
    // loaded with acquire) sees this claim after its copy, and drops what
    // the slot held before.
    m_claimed.store(index + 1, std::memory_order_relaxed);
    std::atomic<float>* slot = m_values.get() + (index % m_capacity) * m_width;
    for (std::uint32_t k = 0; k < m_width; ++k) slot[k].store(record[k], std::memory_order_release);
    m_written.store(index + 1, std::memory_order_release);
}

MeterRingRead MeterRing::Read(std::uint64_t& cursor, float* records, std::uint32_t maxRecords) const noexcept {
    MeterRingRead read;
    const std::uint64_t end = m_written.load(std::memory_order_acquire);
    if (cursor > end) cursor = 0;
    const std::uint64_t oldest = end > m_capacity ? end - m_capacity : 0;
    std::uint64_t first = std::max(cursor, oldest);
    read.lost = first - cursor;
    auto count = static_cast<std::uint32_t>(std::min<std::uint64_t>(end - first, maxRecords));
    for (std::uint32_t r = 0; r < count; ++r) {
        const std::atomic<float>* slot = m_values.get() + ((first + r) % m_capacity) * m_width;
        for (std::uint32_t k = 0; k < m_width; ++k)
            records[std::size_t{r} * m_width + k] = slot[k].load(std::memory_order_acquire);
    }
    // Records older than the writer's claim minus the capacity may have been
    // rewritten while they were copied.
    const std::uint64_t claimed = m_claimed.load(std::memory_order_relaxed);
    const std::uint64_t safe = claimed > m_capacity ? claimed - m_capacity : 0;
    if (first < safe) {
        const auto torn = static_cast<std::uint32_t>(std::min<std::uint64_t>(safe - first, count));
        std::copy(records + std::size_t{torn} * m_width, records + std::size_t{count} * m_width, records);
        count -= torn;
        first += torn;
        read.lost += torn;
    }
    cursor = first + count;
    read.records = count;
    return read;
}

}  // namespace zen
