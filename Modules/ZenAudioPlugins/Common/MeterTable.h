// The meters of one plug-in instance, built from the class's shared
// definitions: the storage the audio thread publishes into, and the generic
// answers to the host's meter queries. Host indices expand the rows in order,
// a per-channel row into one meter per processed channel; consecutive
// per-channel rows expand channel by channel, like a mixer strip:
// "Input Peak 1", "Output Peak 1", "Input Peak 2", "Output Peak 2".
//
// Level and value meters are atomics for every channel the library allows,
// allocated with the table, so they can be read at any time. Arrays and rings
// are allocated by Allocate (from Prepare) for the prepared channel count.
#pragma once

#include <atomic>
#include <cstdint>
#include <memory>
#include <vector>

#include "MeterArray.h"
#include "MeterDefinition.h"
#include "MeterRing.h"

namespace zen {

class MeterTable {
public:
    MeterTable() = default;
    MeterTable(const MeterTable&) = delete;
    MeterTable& operator=(const MeterTable&) = delete;

    // Allocates the scalar storage for up to `maxChannels` channels.
    void Build(const MeterTableDefinition& rows, std::uint32_t maxChannels);
    // Arrays and rings for `channels`; every meter at rest. Not while
    // another thread reads or publishes.
    void Allocate(std::uint32_t channels);

    std::uint32_t GetRowCount() const { return static_cast<std::uint32_t>(m_rows.size()); }

    // Host queries for `channels` processed channels. Any thread.
    std::uint32_t GetCount(std::uint32_t channels) const;
    bool GetInfo(std::uint32_t index, std::uint32_t channels, MeterInfo& info) const;
    float Read(std::uint32_t index, std::uint32_t channels) const;
    bool ReadArray(std::uint32_t index, std::uint32_t channels, float* values, std::uint32_t count) const;
    MeterRingRead ReadRing(std::uint32_t index, std::uint32_t channels, std::uint64_t& cursor, float* records,
                           std::uint32_t maxRecords) const;

    // The audio thread's side, by row and channel (0 for single rows).
    // Out-of-range rows, channels and kinds are ignored.
    void Publish(std::uint32_t row, std::uint32_t channel, float value) noexcept;
    void PublishArray(std::uint32_t row, std::uint32_t channel, const float* values) noexcept;
    void PushRing(std::uint32_t row, std::uint32_t channel, const float* record) noexcept;

    // Level and value meters and arrays back to rest; rings keep their
    // history. Audio thread, or while it is not processing.
    void Rest() noexcept;

private:
    struct Row {
        const MeterDefinition* definition = nullptr;
        std::uint32_t scalarOffset = 0;   // into m_scalars
        std::uint32_t storageOffset = 0;  // into m_arrays or m_rings, per allocated channel
    };

    // The row and channel of a host index; false past the last meter.
    bool Locate(std::uint32_t index, std::uint32_t channels, std::uint32_t& row, std::uint32_t& channel) const;
    std::uint32_t Width(const Row& row) const;
    // Null before Allocate, for another kind or a channel not allocated.
    MeterArray* ArrayAt(std::uint32_t row, std::uint32_t channel) const;
    MeterRing* RingAt(std::uint32_t row, std::uint32_t channel) const;

    std::vector<Row> m_rows;
    std::uint32_t m_maxChannels = 0;
    std::uint32_t m_allocatedChannels = 0;
    std::unique_ptr<std::atomic<float>[]> m_scalars;
    std::vector<std::unique_ptr<MeterArray>> m_arrays;
    std::vector<std::unique_ptr<MeterRing>> m_rings;
};

}  // namespace zen
