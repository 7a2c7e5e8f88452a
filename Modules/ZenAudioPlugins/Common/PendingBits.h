// One bit per parameter, set by any thread and taken by the audio thread:
// the hand-over of stepped parameter values. Several changes of one
// parameter between two blocks coalesce into one bit.
#pragma once

#include <atomic>
#include <cstdint>
#include <memory>

namespace zen {

class PendingBits {
public:
    // Allocates; every bit clear. Not while another thread uses the bits.
    void Resize(std::uint32_t count);

    // Any thread; lock-free.
    void Mark(std::uint32_t index) noexcept {
        m_words[index / 64].fetch_or(std::uint64_t{1} << (index % 64), std::memory_order_release);
    }

    // Clears every bit and calls take(index) for each one that was set, in
    // index order. Audio thread.
    template <class Take>
    void TakeAll(Take&& take) noexcept {
        for (std::uint32_t w = 0; w < m_wordCount; ++w) {
            std::uint64_t bits = m_words[w].exchange(0, std::memory_order_acq_rel);
            while (bits != 0) {
                const auto bit = static_cast<std::uint32_t>(__builtin_ctzll(bits));
                bits &= bits - 1;
                take(w * 64 + bit);
            }
        }
    }

private:
    std::unique_ptr<std::atomic<std::uint64_t>[]> m_words;
    std::uint32_t m_wordCount = 0;
};

}  // namespace zen
