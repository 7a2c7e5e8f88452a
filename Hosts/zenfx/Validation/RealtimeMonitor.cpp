#include "RealtimeMonitor.h"

#include <dlfcn.h>
#include <pthread.h>

#include <atomic>
#include <cerrno>
#include <cstddef>

namespace zenfx {

namespace {

// Per thread and cumulative: a watch reads them at its start and its end.
// Executable TLS needs no allocation, so the allocator may touch it.
thread_local std::uint64_t t_allocations = 0;
thread_local std::uint64_t t_frees = 0;
thread_local std::uint64_t t_locks = 0;

RealtimeCounts ThreadCounts() noexcept { return {t_allocations, t_frees, t_locks}; }

}  // namespace

RealtimeWatch::RealtimeWatch() noexcept : m_start(ThreadCounts()) {}

RealtimeWatch::~RealtimeWatch() = default;

RealtimeCounts RealtimeWatch::Stop() noexcept {
    if (!m_open) return {};
    m_open = false;
    const RealtimeCounts now = ThreadCounts();
    return {now.allocations - m_start.allocations, now.frees - m_start.frees, now.locks - m_start.locks};
}

}  // namespace zenfx

// ---------------------------------------------------------------------------
// Allocator. The sanitizers own malloc and offer hooks; otherwise malloc and
// its relatives are defined here and forward to glibc's own entry points.

#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)

extern "C" int __sanitizer_install_malloc_and_free_hooks(void (*malloc_hook)(const volatile void*, std::size_t),
                                                         void (*free_hook)(const volatile void*));

namespace {

void OnMalloc(const volatile void*, std::size_t) { ++zenfx::t_allocations; }
void OnFree(const volatile void* pointer) {
    if (pointer != nullptr) ++zenfx::t_frees;
}

const bool g_hooksInstalled = __sanitizer_install_malloc_and_free_hooks(&OnMalloc, &OnFree) != 0;

}  // namespace

bool zenfx::RealtimeWatch::SeesAllocations() { return g_hooksInstalled; }

#else

extern "C" {
void* __libc_malloc(std::size_t size);
void* __libc_calloc(std::size_t count, std::size_t size);
void* __libc_realloc(void* pointer, std::size_t size);
void* __libc_memalign(std::size_t alignment, std::size_t size);
void* __libc_valloc(std::size_t size);
void* __libc_pvalloc(std::size_t size);
void __libc_free(void* pointer);

void* malloc(std::size_t size) noexcept {
    ++zenfx::t_allocations;
    return __libc_malloc(size);
}

void* calloc(std::size_t count, std::size_t size) noexcept {
    ++zenfx::t_allocations;
    return __libc_calloc(count, size);
}

void* realloc(void* pointer, std::size_t size) noexcept {
    ++zenfx::t_allocations;
    return __libc_realloc(pointer, size);
}

void free(void* pointer) noexcept {
    if (pointer != nullptr) ++zenfx::t_frees;
    __libc_free(pointer);
}

void* memalign(std::size_t alignment, std::size_t size) noexcept {
    ++zenfx::t_allocations;
    return __libc_memalign(alignment, size);
}

void* aligned_alloc(std::size_t alignment, std::size_t size) noexcept {
    ++zenfx::t_allocations;
    return __libc_memalign(alignment, size);
}

int posix_memalign(void** out, std::size_t alignment, std::size_t size) noexcept {
    if (alignment < sizeof(void*) || (alignment & (alignment - 1)) != 0) return EINVAL;
    ++zenfx::t_allocations;
    void* pointer = __libc_memalign(alignment, size);
    if (pointer == nullptr) return ENOMEM;
    *out = pointer;
    return 0;
}

void* valloc(std::size_t size) noexcept {
    ++zenfx::t_allocations;
    return __libc_valloc(size);
}

void* pvalloc(std::size_t size) noexcept {
    ++zenfx::t_allocations;
    return __libc_pvalloc(size);
}
}  // extern "C"

bool zenfx::RealtimeWatch::SeesAllocations() { return true; }

#endif

// ---------------------------------------------------------------------------
// Locks: counted, then handed to the next definition (the C library, or a
// sanitizer's interceptor, which must keep seeing every lock).

namespace {

template <class Function>
Function NextDefinition(std::atomic<Function>& cache, const char* name) {
    Function function = cache.load(std::memory_order_acquire);
    if (function == nullptr) {
        function = reinterpret_cast<Function>(dlsym(RTLD_NEXT, name));
        cache.store(function, std::memory_order_release);
    }
    return function;
}

using MutexFunction = int (*)(pthread_mutex_t*);
using RwLockFunction = int (*)(pthread_rwlock_t*);
using SpinFunction = int (*)(pthread_spinlock_t*);

std::atomic<MutexFunction> g_mutexLock{nullptr};
std::atomic<MutexFunction> g_mutexTryLock{nullptr};
std::atomic<RwLockFunction> g_readLock{nullptr};
std::atomic<RwLockFunction> g_writeLock{nullptr};
std::atomic<RwLockFunction> g_tryReadLock{nullptr};
std::atomic<RwLockFunction> g_tryWriteLock{nullptr};
std::atomic<SpinFunction> g_spinLock{nullptr};

// Resolved before main, so that the first lock of a thread never waits on the
// dynamic linker.
[[maybe_unused]] const bool g_resolved = [] {
    NextDefinition(g_mutexLock, "pthread_mutex_lock");
    NextDefinition(g_mutexTryLock, "pthread_mutex_trylock");
    NextDefinition(g_readLock, "pthread_rwlock_rdlock");
    NextDefinition(g_writeLock, "pthread_rwlock_wrlock");
    NextDefinition(g_tryReadLock, "pthread_rwlock_tryrdlock");
    NextDefinition(g_tryWriteLock, "pthread_rwlock_trywrlock");
    NextDefinition(g_spinLock, "pthread_spin_lock");
    return true;
}();

}  // namespace

extern "C" {

int pthread_mutex_lock(pthread_mutex_t* mutex) noexcept {
    ++zenfx::t_locks;
    return NextDefinition(g_mutexLock, "pthread_mutex_lock")(mutex);
}

int pthread_mutex_trylock(pthread_mutex_t* mutex) noexcept {
    ++zenfx::t_locks;
    return NextDefinition(g_mutexTryLock, "pthread_mutex_trylock")(mutex);
}

int pthread_rwlock_rdlock(pthread_rwlock_t* lock) noexcept {
    ++zenfx::t_locks;
    return NextDefinition(g_readLock, "pthread_rwlock_rdlock")(lock);
}

int pthread_rwlock_wrlock(pthread_rwlock_t* lock) noexcept {
    ++zenfx::t_locks;
    return NextDefinition(g_writeLock, "pthread_rwlock_wrlock")(lock);
}

int pthread_rwlock_tryrdlock(pthread_rwlock_t* lock) noexcept {
    ++zenfx::t_locks;
    return NextDefinition(g_tryReadLock, "pthread_rwlock_tryrdlock")(lock);
}

int pthread_rwlock_trywrlock(pthread_rwlock_t* lock) noexcept {
    ++zenfx::t_locks;
    return NextDefinition(g_tryWriteLock, "pthread_rwlock_trywrlock")(lock);
}

int pthread_spin_lock(pthread_spinlock_t* lock) noexcept {
    ++zenfx::t_locks;
    return NextDefinition(g_spinLock, "pthread_spin_lock")(lock);
}

}  // extern "C"
