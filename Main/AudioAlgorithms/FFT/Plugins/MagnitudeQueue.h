// A priority queue of spectral coefficients by magnitude, for the heap
// integration: magnitudes fall into buckets 1/128 octave (0.05 dB) wide, so
// pushing and taking the largest are constant time, and coefficients within
// one bucket come out first in, first out (in the order the integration
// reached them, as a steady partial's neighbours should). Holds a frame's
// coefficients down to 2^-32 of the largest (192 dB); smaller ones share the
// last bucket.
#pragma once

#include <array>
#include <cstdint>
#include <vector>

namespace ora::fft {

class MagnitudeQueue {
public:
    static constexpr unsigned kBucketsPerOctave = 128;
    static constexpr std::size_t kBuckets = 4096;

    // Room for `capacity` entries between two Starts. Allocates.
    void Configure(std::size_t capacity);
    // Empties the queue; `largest` bounds the magnitudes that will be pushed.
    void Start(float largest) noexcept;
    // `magnitude` > 0; at most `capacity` pushes per Start.
    void Push(float magnitude, std::int32_t value) noexcept;
    bool Empty() const noexcept { return m_summary == 0; }
    // A value of (nearly) the largest magnitude; the queue must not be empty.
    std::int32_t Pop() noexcept;

private:
    static constexpr std::size_t kWords = kBuckets / 64;
    static_assert(kWords <= 64, "one summary word covers every bucket word");

    std::uint32_t m_topKey = 0;
    std::vector<std::int32_t> m_head;  // per bucket, valid while its bit is set
    std::vector<std::int32_t> m_tail;
    std::vector<std::int32_t> m_next;  // per entry
    std::vector<std::int32_t> m_value;
    std::array<std::uint64_t, kWords> m_words{};
    std::uint64_t m_summary = 0;
    std::size_t m_used = 0;
};

}  // namespace ora::fft
