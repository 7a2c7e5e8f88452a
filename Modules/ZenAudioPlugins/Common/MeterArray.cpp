#include "MeterArray.h"

namespace zen {

MeterArray::MeterArray(std::uint32_t size) : m_size(size), m_values(new std::atomic<float>[size]) {
    for (std::uint32_t i = 0; i < m_size; ++i) m_values[i].store(0.0f, std::memory_order_relaxed);
}

// Values are stored with release and loaded with acquire (plain moves on
// x86): a reader that sees any value of a publication under way also sees
// its odd count when it looks again, so no fence is needed.
template <class Source>
void MeterArray::Write(Source source) noexcept {
    const std::uint64_t sequence = m_sequence.load(std::memory_order_relaxed);
    m_sequence.store(sequence + 1, std::memory_order_relaxed);
    for (std::uint32_t i = 0; i < m_size; ++i) m_values[i].store(source(i), std::memory_order_release);
    m_sequence.store(sequence + 2, std::memory_order_release);
}

void MeterArray::Publish(const float* values) noexcept {
    Write([values](std::uint32_t i) { return values[i]; });
}

void MeterArray::Fill(float value) noexcept {
    Write([value](std::uint32_t) { return value; });
}

bool MeterArray::Read(float* values) const noexcept {
    for (int attempt = 0; attempt < kReadAttempts; ++attempt) {
        const std::uint64_t before = m_sequence.load(std::memory_order_acquire);
        if ((before & 1) != 0) continue;
        for (std::uint32_t i = 0; i < m_size; ++i) values[i] = m_values[i].load(std::memory_order_acquire);
        if (m_sequence.load(std::memory_order_relaxed) == before) return true;
    }
    return false;
}

}  // namespace zen
