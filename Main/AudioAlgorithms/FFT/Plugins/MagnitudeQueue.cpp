#include "FFT/Plugins/MagnitudeQueue.h"

#include <cstring>

namespace ora::fft {

namespace {

// Positive floats order like their bit patterns: the exponent and the top
// seven bits of the mantissa make a key 1/128 octave fine.
std::uint32_t Key(float magnitude) noexcept {
    std::uint32_t bits;
    std::memcpy(&bits, &magnitude, sizeof bits);
    return bits >> 16;
}

}  // namespace

void MagnitudeQueue::Configure(std::size_t capacity) {
    m_head.assign(kBuckets, -1);
    m_tail.assign(kBuckets, -1);
    m_next.assign(capacity, -1);
    m_value.assign(capacity, 0);
    m_words.fill(0);
    m_summary = 0;
    m_used = 0;
}

void MagnitudeQueue::Start(float largest) noexcept {
    m_topKey = Key(largest);
    if (m_summary != 0) m_words.fill(0);
    m_summary = 0;
    m_used = 0;
}

void MagnitudeQueue::Push(float magnitude, std::int32_t value) noexcept {
    const std::uint32_t key = Key(magnitude);
    std::size_t bucket = key >= m_topKey ? 0 : m_topKey - key;
    if (bucket >= kBuckets) bucket = kBuckets - 1;
    const auto entry = static_cast<std::int32_t>(m_used++);
    m_value[static_cast<std::size_t>(entry)] = value;
    const std::size_t word = bucket / 64;
    const std::uint64_t bit = std::uint64_t{1} << (bucket % 64);
    m_next[static_cast<std::size_t>(entry)] = -1;
    if ((m_words[word] & bit) != 0)
        m_next[static_cast<std::size_t>(m_tail[bucket])] = entry;
    else
        m_head[bucket] = entry;
    m_tail[bucket] = entry;
    m_words[word] |= bit;
    m_summary |= std::uint64_t{1} << word;
}

std::int32_t MagnitudeQueue::Pop() noexcept {
    const auto word = static_cast<std::size_t>(__builtin_ctzll(m_summary));
    const auto bucket = word * 64 + static_cast<std::size_t>(__builtin_ctzll(m_words[word]));
    const auto entry = static_cast<std::size_t>(m_head[bucket]);
    const std::int32_t next = m_next[entry];
    m_head[bucket] = next;
    if (next < 0) {
        m_words[word] &= ~(std::uint64_t{1} << (bucket % 64));
        if (m_words[word] == 0) m_summary &= ~(std::uint64_t{1} << word);
    }
    return m_value[entry];
}

}  // namespace ora::fft
