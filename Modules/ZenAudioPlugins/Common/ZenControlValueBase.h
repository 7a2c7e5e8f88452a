// The live value of an algorithm parameter: the current value, exchanged
// atomically, and a link to the algorithm that owns it. Editors bind their
// controls to values of this type.
#pragma once

#include <atomic>

class ZenAudioAlgorithm;

class ZenControlValueBase {
public:
    ZenControlValueBase(ZenAudioAlgorithm* owner, float initialValue) : m_owner(owner), m_value(initialValue) {}
    ZenControlValueBase(const ZenControlValueBase&) = delete;
    ZenControlValueBase& operator=(const ZenControlValueBase&) = delete;

    ZenAudioAlgorithm* GetOwner() const { return m_owner; }
    float Get() const { return m_value.load(std::memory_order_acquire); }
    // Returns the previous value.
    float Exchange(float value) { return m_value.exchange(value, std::memory_order_acq_rel); }

private:
    ZenAudioAlgorithm* m_owner;
    std::atomic<float> m_value;
};

