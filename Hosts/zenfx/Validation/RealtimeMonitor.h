// Counts heap allocations, frees and lock acquisitions that the calling
// thread makes while a watch is open. The process's allocator and pthread
// locks are interposed (allocator hooks under AddressSanitizer and
// ThreadSanitizer), so calls from inside a dlopen'ed plug-in library are seen
// as well. Only the watching thread's calls count.
//
//   RealtimeWatch watch;
//   audio.Process(channels, frames);
//   RealtimeCounts counts = watch.Stop();
//
// Locks taken through futexes directly (QMutex) are not seen.
#pragma once

#include <cstdint>

namespace zenfx {

struct RealtimeCounts {
    std::uint64_t allocations = 0;  // malloc, calloc, realloc, aligned forms, operator new
    std::uint64_t frees = 0;
    std::uint64_t locks = 0;  // mutex, read-write lock and spin lock acquisitions, tries included

    RealtimeCounts& operator+=(const RealtimeCounts& other) {
        allocations += other.allocations;
        frees += other.frees;
        locks += other.locks;
        return *this;
    }
};

class RealtimeWatch {
public:
    RealtimeWatch() noexcept;
    ~RealtimeWatch();
    RealtimeWatch(const RealtimeWatch&) = delete;
    RealtimeWatch& operator=(const RealtimeWatch&) = delete;

    // Closes the watch and returns what this thread did since it opened.
    RealtimeCounts Stop() noexcept;

    // False when this build cannot see allocations (a replacement allocator
    // that bypasses ours); the counts are then always 0.
    static bool SeesAllocations();

private:
    RealtimeCounts m_start;
    bool m_open = true;
};

}  // namespace zenfx
