// Planar channels to one interleaved buffer. The vector forms take two
// channels; other counts use `ref`.
#pragma once

#include <cstddef>

#include "System/DispatchSettings.h"

namespace ora::numeric {

struct InterleaveConfig {
    int channels = 1;

    bool operator==(const InterleaveConfig& other) const { return channels == other.channels; }
};

class Interleave {
public:
    explicit Interleave(const InterleaveConfig& config = {});

    void Reconfigure(const InterleaveConfig& config);
    // `interleaved` holds channels * frames samples; no overlap with `planar`.
    void Process(const float* const* planar, float* interleaved, std::size_t frames) const noexcept;

    int GetChannelCount() const { return m_config.channels; }
    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }
    bool operator==(const Interleave& other) const { return m_config == other.m_config; }

private:
    using TwoKernel = void (*)(const float* a, const float* b, float* interleaved, std::size_t frames);

    InterleaveConfig m_config;
    system::KernelForm m_form;
    TwoKernel m_two = nullptr;  // null: the reference loop
};

}  // namespace ora::numeric
