#include "FFT/Buffer.h"

#include <algorithm>
#include <cmath>
#include <cstring>

namespace ora::fft {

void Buffer::Allocate(std::size_t capacity, Layout layout) {
    m_layout = layout;
    if (layout == Layout::Ring) {
        std::size_t size = 1;
        while (size < capacity) size <<= 1;
        capacity = size;
        m_mask = size - 1;
    }
    m_data.Resize(capacity);
    m_written = 0;
}

void Buffer::Clear() noexcept {
    m_data.Clear();
    m_written = 0;
}

void Buffer::Write(const float* samples, std::size_t count) noexcept {
    if (m_data.empty()) return;
    for (std::size_t done = 0; done < count;) {
        const std::size_t at = static_cast<std::size_t>(m_written) & m_mask;
        const std::size_t n = std::min(count - done, m_data.size() - at);
        std::memcpy(m_data.data() + at, samples + done, n * sizeof(float));
        done += n;
        m_written += static_cast<std::int64_t>(n);
    }
}

void Buffer::WriteLimited(const float* samples, std::size_t count, float limit) noexcept {
    if (m_data.empty()) return;
    for (std::size_t done = 0; done < count;) {
        const std::size_t at = static_cast<std::size_t>(m_written) & m_mask;
        const std::size_t n = std::min(count - done, m_data.size() - at);
        float* to = m_data.data() + at;
        const float* from = samples + done;
        for (std::size_t i = 0; i < n; ++i) {
            const float x = from[i];
            to[i] = std::isfinite(x) ? std::min(std::max(x, -limit), limit) : 0.0f;
        }
        done += n;
        m_written += static_cast<std::int64_t>(n);
    }
}

float Buffer::At(std::int64_t position) const noexcept {
    const auto capacity = static_cast<std::int64_t>(m_data.size());
    if (position < 0 || position >= m_written || position < m_written - capacity) return 0.0f;
    return m_data[static_cast<std::size_t>(position) & m_mask];
}

void Buffer::Read(std::int64_t start, float* out, std::size_t count) const noexcept {
    const auto capacity = static_cast<std::int64_t>(m_data.size());
    const std::int64_t end = start + static_cast<std::int64_t>(count);
    const std::int64_t from = std::min(std::max({start, m_written - capacity, std::int64_t{0}}), end);
    const std::int64_t to = std::max(std::min(end, m_written), from);
    std::fill(out, out + (from - start), 0.0f);
    std::fill(out + (to - start), out + count, 0.0f);
    for (std::int64_t p = from; p < to;) {
        const std::size_t at = static_cast<std::size_t>(p) & m_mask;
        const auto n = static_cast<std::size_t>(std::min<std::int64_t>(to - p, capacity - static_cast<std::int64_t>(at)));
        std::memcpy(out + (p - start), m_data.data() + at, n * sizeof(float));
        p += static_cast<std::int64_t>(n);
    }
}

void Buffer::Shift(std::size_t count) noexcept {
    const std::size_t size = m_data.size();
    count = std::min(count, size);
    std::memmove(m_data.data(), m_data.data() + count, (size - count) * sizeof(float));
    std::fill(m_data.data() + (size - count), m_data.data() + size, 0.0f);
}

}  // namespace ora::fft
