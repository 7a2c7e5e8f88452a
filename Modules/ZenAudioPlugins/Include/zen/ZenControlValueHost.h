// Binding controls (knobs, faders, control surfaces) to parameters by
// identifier and normalised position. A position is the value's place on the
// parameter's taper: linear, logarithmic (frequencies) or the index in a list,
// always in 0..1.
#pragma once

#include <cstdint>

class ZenControlValueHost {
public:
    static constexpr const char* kInterfaceName = "ZenControlValueHost";

    // Index of the parameter with this identifier or label (case-sensitive),
    // or -1. Any thread.
    virtual std::int32_t FindParameter(const char* identifierOrLabel) const = 0;

    // Position of the current value, 0..1. Any thread; lock-free.
    virtual float GetParameterPosition(std::uint32_t index) const = 0;

    // Sets the value at a position (clamped to 0..1); as SetParameter.
    virtual bool SetParameterPosition(std::uint32_t index, float position) = 0;

protected:
    ~ZenControlValueHost() = default;
};
