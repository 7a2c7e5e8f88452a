// A fixed-size array of meter values (a spectrum, band levels) that one
// writer, the audio thread, publishes whole and any number of readers copy
// whole, without locks: a sequence count that is odd while a publication is
// under way tells a reader to try again. The writer never waits.
#pragma once

#include <atomic>
#include <cstdint>
#include <memory>

namespace zen {

class MeterArray {
public:
    // Attempts a reader makes before it gives up on a busy writer.
    static constexpr int kReadAttempts = 64;

    explicit MeterArray(std::uint32_t size);  // allocates; all values 0

    MeterArray(const MeterArray&) = delete;
    MeterArray& operator=(const MeterArray&) = delete;

    std::uint32_t GetSize() const { return m_size; }

    // The single writer; `values` holds GetSize() floats.
    void Publish(const float* values) noexcept;
    void Fill(float value) noexcept;

    // Any thread: the values of one publication; false when every attempt
    // overlapped a publication.
    bool Read(float* values) const noexcept;

private:
    template <class Source>
    void Write(Source source) noexcept;

    const std::uint32_t m_size;
    std::unique_ptr<std::atomic<float>[]> m_values;
    std::atomic<std::uint64_t> m_sequence{0};
};

}  // namespace zen
