// A smoothed control value: one element per consumer (usually per channel),
// each with an atomically exchanged target and a current value that the
// audio thread moves toward the target with the shared 200 ms smoother.
#pragma once

#include <atomic>
#include <cmath>
#include <cstddef>
#include <memory>

namespace zen {

class SmoothedValueGroup {
public:
    struct Element {
        std::atomic<float> target{0.0f};
        std::atomic<double> current{0.0};
    };

    // Per-block view of one element for the audio thread: load once, advance
    // per sample in a register, store once.
    class Cursor {
    public:
        Cursor(Element& element, double a, double b) noexcept
            : m_element(element),
              m_current(element.current.load(std::memory_order_relaxed)),
              m_target(element.target.load(std::memory_order_relaxed)),
              m_a(a),
              m_b(b),
              m_settled(m_a * m_current + m_b * m_target == m_current) {}
        ~Cursor() {
            // Snap only far below float resolution: a ramp toward 0 never
            // reaches denormals, and no block split can change what is heard.
            if (std::fabs(m_current - m_target) <= kSnapDistance) m_current = m_target;
            m_element.current.store(m_current, std::memory_order_relaxed);
        }
        Cursor(const Cursor&) = delete;
        Cursor& operator=(const Cursor&) = delete;

        double Next() noexcept {
            m_current = m_a * m_current + m_b * m_target;
            return m_current;
        }

        // True when the recursion stands at its fixed point (a few hundred
        // ulps short of the target, about a second after a change): every
        // Next() of this block returns Value(), so a caller may apply it as a
        // constant, by a vector kernel, instead of advancing per sample.
        // Next() itself does not test it: a branch per sample costs light
        // loops more than the recursion it saves.
        bool IsSettled() const noexcept { return m_settled; }
        double Value() const noexcept { return m_current; }

    private:
        static constexpr double kSnapDistance = 1e-30;
        Element& m_element;
        double m_current;
        const double m_target;
        const double m_a;
        const double m_b;
        const bool m_settled;
    };

    SmoothedValueGroup(std::size_t elementCount, float initialValue);
    virtual ~SmoothedValueGroup() = default;

    SmoothedValueGroup(const SmoothedValueGroup&) = delete;
    SmoothedValueGroup& operator=(const SmoothedValueGroup&) = delete;

    std::size_t GetSize() const { return m_size; }
    float GetInitialValue() const { return m_initialValue; }
    Element& operator[](std::size_t i) { return m_elements[i]; }
    const Element& operator[](std::size_t i) const { return m_elements[i]; }

    // Any thread. Exchanges every element's target; when smoothing is not
    // running (globally, or for the owner, see SetRampingFlag) the current
    // values jump to the target, so settings made before processing take
    // effect without a ramp.
    void SetTarget(float value);

    // Every current value jumps to its target (after a reset or prepare).
    void Settle();

    // The owner's "processing" flag; ramps happen only while it is set.
    void SetRampingFlag(const std::atomic<bool>* processing) { m_processing = processing; }

    // Cursor over element i with the shared smoother's coefficients.
    Cursor Track(std::size_t i) noexcept;

private:
    std::unique_ptr<Element[]> m_elements;
    std::size_t m_size;
    float m_initialValue;
    const std::atomic<bool>* m_processing = nullptr;
};

}  // namespace zen
