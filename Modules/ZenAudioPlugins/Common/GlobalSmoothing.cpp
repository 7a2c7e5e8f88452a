#include "GlobalSmoothing.h"

#include <atomic>

#include "OnePoleSmoother.h"

namespace zen::GlobalSmoothing {

namespace {
std::atomic<int> g_processingInstances{0};
}

OnePoleSmoother& SharedSmoother() {
    static OnePoleSmoother smoother(kTimeConstantMs);
    return smoother;
}

namespace {
// Created while the library loads, so that the first change of sample rate
// already finds it in the list of smoothers.
[[maybe_unused]] const OnePoleSmoother& g_createdAtLoad = SharedSmoother();
}  // namespace

bool IsRunning() { return g_processingInstances.load(std::memory_order_acquire) > 0; }

void EnterProcessing() { g_processingInstances.fetch_add(1, std::memory_order_acq_rel); }

void LeaveProcessing() { g_processingInstances.fetch_sub(1, std::memory_order_acq_rel); }

}  // namespace zen::GlobalSmoothing
