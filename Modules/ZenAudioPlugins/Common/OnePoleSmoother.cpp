#include "OnePoleSmoother.h"

#include <algorithm>
#include <cmath>
#include <mutex>
#include <vector>

namespace zen {

namespace {

constexpr double kTwoPi = 6.283185307179586;

// The list is touched only from UI threads (construction, destruction,
// preparation); the audio path reads coefficients, never the list.
struct SmootherList {
    std::mutex mutex;
    std::vector<OnePoleSmoother*> smoothers;
};

SmootherList& List() {
    static SmootherList list;
    return list;
}

}  // namespace

OnePoleSmoother::OnePoleSmoother(int timeConstantMs) : m_timeConstantMs(timeConstantMs) {
    auto& list = List();
    std::lock_guard<std::mutex> lock(list.mutex);
    list.smoothers.push_back(this);
}

OnePoleSmoother::~OnePoleSmoother() {
    auto& list = List();
    std::lock_guard<std::mutex> lock(list.mutex);
    list.smoothers.erase(std::remove(list.smoothers.begin(), list.smoothers.end(), this), list.smoothers.end());
}

void OnePoleSmoother::SetSampleRate(double sampleRate) {
    const double samples = static_cast<double>(m_timeConstantMs) * sampleRate * 0.001;
    const double a = samples > 0.0 ? std::min(std::exp(-kTwoPi / samples), 1.0) : 0.0;
    m_a.store(a, std::memory_order_relaxed);
    m_b.store(1.0 - a, std::memory_order_relaxed);
}

void OnePoleSmoother::RefreshAll(double sampleRate) {
    auto& list = List();
    std::lock_guard<std::mutex> lock(list.mutex);
    for (OnePoleSmoother* smoother : list.smoothers) smoother->SetSampleRate(sampleRate);
}

}  // namespace zen
