// A heap buffer aligned for vector loads (64 bytes: a cache line, and a
// 16-float lane frame). Sized when a processing object is prepared; copying
// is deleted so DSP memory is never duplicated by accident, moving is allowed.
#pragma once

#include <cstddef>
#include <cstdlib>
#include <cstring>
#include <new>
#include <type_traits>
#include <utility>

namespace ora {

constexpr std::size_t kBufferAlignment = 64;

template <class T>
class AlignedBuffer {
    static_assert(std::is_trivially_copyable<T>::value, "AlignedBuffer holds plain samples");

public:
    AlignedBuffer() = default;
    // Zero-filled; throws std::bad_alloc.
    explicit AlignedBuffer(std::size_t size) { Resize(size); }
    ~AlignedBuffer() { std::free(m_data); }

    AlignedBuffer(const AlignedBuffer&) = delete;
    AlignedBuffer& operator=(const AlignedBuffer&) = delete;
    AlignedBuffer(AlignedBuffer&& other) noexcept
        : m_data(std::exchange(other.m_data, nullptr)), m_size(std::exchange(other.m_size, 0)) {}
    AlignedBuffer& operator=(AlignedBuffer&& other) noexcept {
        if (this != &other) {
            std::free(m_data);
            m_data = std::exchange(other.m_data, nullptr);
            m_size = std::exchange(other.m_size, 0);
        }
        return *this;
    }

    // Reallocates to `size` zeroed elements (contents are not kept).
    void Resize(std::size_t size) {
        std::free(m_data);
        m_data = nullptr;
        m_size = 0;
        if (size == 0) return;
        const std::size_t bytes = (size * sizeof(T) + kBufferAlignment - 1) / kBufferAlignment * kBufferAlignment;
        m_data = static_cast<T*>(std::aligned_alloc(kBufferAlignment, bytes));
        if (m_data == nullptr) throw std::bad_alloc();
        std::memset(static_cast<void*>(m_data), 0, bytes);
        m_size = size;
    }

    void Clear() noexcept {
        if (m_data != nullptr) std::memset(static_cast<void*>(m_data), 0, m_size * sizeof(T));
    }

    T* data() noexcept { return m_data; }
    const T* data() const noexcept { return m_data; }
    std::size_t size() const noexcept { return m_size; }
    bool empty() const noexcept { return m_size == 0; }
    T& operator[](std::size_t i) noexcept { return m_data[i]; }
    const T& operator[](std::size_t i) const noexcept { return m_data[i]; }
    T* begin() noexcept { return m_data; }
    T* end() noexcept { return m_data + m_size; }
    const T* begin() const noexcept { return m_data; }
    const T* end() const noexcept { return m_data + m_size; }

private:
    T* m_data = nullptr;
    std::size_t m_size = 0;
};

}  // namespace ora
