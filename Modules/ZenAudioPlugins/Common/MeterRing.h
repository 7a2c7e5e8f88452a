// A history of fixed-width meter records (goniometer points, gain-reduction
// or loudness history) written by one writer, the audio thread, and drained
// by any number of readers, each with a cursor of its own. The writer never
// waits: it overwrites the oldest record, and a reader that fell behind
// learns how many records it lost.
#pragma once

#include <atomic>
#include <cstdint>
#include <memory>

#include "zen/ParameterInfo.h"

namespace zen {

class MeterRing {
public:
    MeterRing(std::uint32_t recordWidth, std::uint32_t capacity);  // allocates; empty

    MeterRing(const MeterRing&) = delete;
    MeterRing& operator=(const MeterRing&) = delete;

    std::uint32_t GetRecordWidth() const { return m_width; }
    std::uint32_t GetCapacity() const { return m_capacity; }
    // Records pushed since construction.
    std::uint64_t GetWritten() const { return m_written.load(std::memory_order_acquire); }

    // The single writer; `record` holds GetRecordWidth() floats.
    void Push(const float* record) noexcept;

    // Any thread: copies up to maxRecords records from `cursor` on into
    // `records` and advances the cursor. Records overwritten before they were
    // copied are skipped and counted as lost. A cursor beyond the records
    // written starts again from 0.
    MeterRingRead Read(std::uint64_t& cursor, float* records, std::uint32_t maxRecords) const noexcept;

private:
    const std::uint32_t m_width;
    const std::uint32_t m_capacity;
    std::unique_ptr<std::atomic<float>[]> m_values;
    // The record being written (claimed before its slot is overwritten) and
    // the records complete.
    std::atomic<std::uint64_t> m_claimed{0};
    std::atomic<std::uint64_t> m_written{0};
};

}  // namespace zen
