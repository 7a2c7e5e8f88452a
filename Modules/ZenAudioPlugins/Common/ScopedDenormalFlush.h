// Flush-to-zero and denormals-are-zero for the scope of a processing call, so
// that decaying filter and delay state never falls into slow denormal
// arithmetic. The previous control word is restored on exit.
#pragma once

#if defined(__SSE__) || defined(__x86_64__)
#include <xmmintrin.h>
#endif

namespace zen {

class ScopedDenormalFlush {
public:
#if defined(__SSE__) || defined(__x86_64__)
    ScopedDenormalFlush() noexcept : m_saved(_mm_getcsr()) { _mm_setcsr(m_saved | kFlushBits); }
    ~ScopedDenormalFlush() { _mm_setcsr(m_saved); }

private:
    static constexpr unsigned kFlushBits = 0x8040u;  // FTZ | DAZ
    unsigned m_saved;
#else
    ScopedDenormalFlush() noexcept = default;
#endif

public:
    ScopedDenormalFlush(const ScopedDenormalFlush&) = delete;
    ScopedDenormalFlush& operator=(const ScopedDenormalFlush&) = delete;
};

}  // namespace zen
