#include "PendingBits.h"

namespace zen {

void PendingBits::Resize(std::uint32_t count) {
    m_wordCount = (count + 63) / 64;
    m_words.reset(new std::atomic<std::uint64_t>[m_wordCount]);
    for (std::uint32_t w = 0; w < m_wordCount; ++w) m_words[w].store(0);
}

}  // namespace zen
