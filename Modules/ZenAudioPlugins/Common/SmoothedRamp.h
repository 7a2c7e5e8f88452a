// One block of a smoothed value as plain floats, for owners that need the
// value at chosen samples (coefficients set at control points) or as an
// array (cross-fades), rather than stepping a cursor in their own loop.
// A value resting on its target costs nothing: it reads as a constant.
#pragma once

#include <cstddef>
#include <cstdint>
#include <limits>
#include <vector>

#include "SmoothedValueGroup.h"

namespace zen {

class SmoothedRamp {
public:
    // Sizes the buffer for blocks of up to maxBlock frames. Allocates.
    void Prepare(std::uint32_t maxBlock);

    // Advances element `element` of `group` over `frames` samples (at most
    // the prepared block) and keeps the values. Audio thread.
    void Read(SmoothedValueGroup& group, std::uint32_t frames, std::size_t element = 0) noexcept;
    // A constant block, for a value that is not smoothed.
    void Hold(float value) noexcept {
        m_constant = true;
        m_value = value;
    }

    // Every sample of the block has the same value.
    bool IsConstant() const { return m_constant; }
    float operator[](std::uint32_t i) const { return m_constant ? m_value : m_values[i]; }
    // The values of samples [from, from + count) all equal `value`.
    bool Holds(float value, std::uint32_t from, std::uint32_t count) const noexcept;
    // Per-sample values; only while not constant.
    const float* Data() const { return m_values.data(); }

    // For values handed on to an algorithm at control points: the value at
    // sample i, and whether it differs from the last one handed on (always
    // after Forget, so that a freshly prepared algorithm gets every value).
    bool Changed(std::uint32_t i, float& value) noexcept {
        value = (*this)[i];
        if (value == m_handed) return false;
        m_handed = value;
        return true;
    }
    void Forget() noexcept;
    // Constant, and the value last handed on: nothing to hand on this block.
    bool Settled() const { return m_constant && m_value == m_handed; }

private:
    std::vector<float> m_values;
    float m_value = 0.0f;
    bool m_constant = true;
    float m_handed = 0.0f;
};

}  // namespace zen
