// Per-instance record of one plug-in parameter: the live value (exchanged
// atomically, so any thread may set it while the audio thread reads it), its
// normalised position under the parameter's taper, and a count of changes
// that editors compare with the count they last saw.
#pragma once

#include <atomic>
#include <cstdint>
#include <vector>

#include "ParameterDefinition.h"

namespace zen {

class PluginParameter {
public:
    PluginParameter() = default;
    PluginParameter(const PluginParameter&) = delete;
    PluginParameter& operator=(const PluginParameter&) = delete;

    // Binds the record to its definition and sets the default value.
    void Init(const ParameterDefinition& definition);

    const ParameterDefinition& Definition() const { return *m_definition; }
    ParameterTaper GetTaper() const { return static_cast<ParameterTaper>(m_taper); }
    float GetMinimum() const { return m_minimum; }
    float GetMaximum() const { return m_maximum; }
    const std::vector<float>& GetDiscreteValues() const { return m_discreteValues; }

    float GetValue() const { return m_value.load(std::memory_order_acquire); }
    // Returns the previous value; counts the change.
    float Exchange(float value);

    std::uint32_t GetChangeCount() const { return m_changes.load(std::memory_order_acquire); }
    void MarkChanged() { m_changes.fetch_add(1, std::memory_order_acq_rel); }

    float GetPosition() const { return m_position.load(std::memory_order_relaxed); }
    void RefreshPosition() { m_position.store(ValueToPosition(GetValue()), std::memory_order_relaxed); }

    // Position in 0..1 of a value. Logarithmic: ln(v/m)/ln(max/m) with
    // m = min + 1e-10 (a minimum of 0 stays usable; callers clamp). List: the
    // index of the first discrete value not below v over (count - 1); a value
    // above every entry gives 0. Linear: (v - min)/(max - min).
    float ValueToPosition(float value) const;
    float PositionToValue(float position) const;

private:
    const ParameterDefinition* m_definition = nullptr;
    std::uint32_t m_taper = 0;
    float m_minimum = 0.0f;
    float m_maximum = 1.0f;
    std::atomic<float> m_position{0.0f};
    std::vector<float> m_discreteValues;
    std::atomic<float> m_value{0.0f};
    std::atomic<std::uint32_t> m_changes{0};
};

}  // namespace zen
