// The allocation and lock counter the validator judges plug-ins by: it must
// see every kind of allocation and lock of the watching thread, and nothing
// else.
#include <gtest/gtest.h>

#include <cstdlib>
#include <memory>
#include <mutex>
#include <shared_mutex>
#include <string>
#include <thread>
#include <vector>

#include "RealtimeMonitor.h"

using zenfx::RealtimeCounts;
using zenfx::RealtimeWatch;

namespace {

// Keeps the compiler from removing an allocation whose result is unused.
void Use(void* pointer) { asm volatile("" : : "r"(pointer) : "memory"); }

}  // namespace

TEST(RealtimeMonitor, CountsEveryAllocationFreeAndLockOfTheWatchingThread) {
    ASSERT_TRUE(RealtimeWatch::SeesAllocations());
    std::mutex mutex;
    std::shared_mutex shared;
    RealtimeWatch watch;
    auto* number = new int(3);
    Use(number);
    delete number;
    void* block = std::malloc(100);
    Use(block);
    block = std::realloc(block, 10000);
    Use(block);
    std::free(block);
    void* aligned = nullptr;
    ASSERT_EQ(posix_memalign(&aligned, 64, 256), 0);
    Use(aligned);
    std::free(aligned);
    std::vector<float> grown;
    for (int i = 0; i < 100; ++i) grown.push_back(1.0f);
    { std::lock_guard<std::mutex> lock(mutex); }
    { std::shared_lock<std::shared_mutex> lock(shared); }
    { std::unique_lock<std::shared_mutex> lock(shared); }
    if (mutex.try_lock()) mutex.unlock();
    const RealtimeCounts counts = watch.Stop();
    EXPECT_GE(counts.allocations, 5u);  // new, malloc, realloc, posix_memalign, vector growth
    EXPECT_GE(counts.frees, 3u);
    EXPECT_EQ(counts.locks, 4u);  // mutex, read, write and try locks
}

TEST(RealtimeMonitor, CountsNothingOfOtherThreadsOrOutsideTheWatch) {
    constexpr int kOtherAllocations = 200;
    RealtimeWatch watch;
    std::thread other([] {
        for (int i = 0; i < kOtherAllocations; ++i) {
            auto text = std::make_unique<std::string>(100, 'x');
            Use(text.get());
        }
        std::mutex mutex;
        for (int i = 0; i < kOtherAllocations; ++i) std::lock_guard<std::mutex> lock(mutex);
    });
    other.join();
    const RealtimeCounts whileOtherRan = watch.Stop();
    // Starting and joining a thread costs this one a few allocations at most.
    EXPECT_LT(whileOtherRan.allocations, 10u);
    EXPECT_LT(whileOtherRan.locks, 10u);

    RealtimeWatch quiet;
    float sum = 0.0f;
    for (int i = 0; i < 1000; ++i) sum += static_cast<float>(i);
    Use(&sum);
    const RealtimeCounts counts = quiet.Stop();
    EXPECT_EQ(counts.allocations, 0u);
    EXPECT_EQ(counts.frees, 0u);
    EXPECT_EQ(counts.locks, 0u);
    // A closed watch reports nothing more.
    auto* late = new int(1);
    Use(late);
    delete late;
    EXPECT_EQ(quiet.Stop().allocations, 0u);
}
