// One interleaved buffer to planar channels. The vector forms take two
// channels; other counts use `ref`.
#pragma once

#include <cstddef>

#include "System/DispatchSettings.h"

namespace ora::numeric {

struct DeinterleaveConfig {
    int channels = 1;

    bool operator==(const DeinterleaveConfig& other) const { return channels == other.channels; }
};

class Deinterleave {
public:
    explicit Deinterleave(const DeinterleaveConfig& config = {});

    void Reconfigure(const DeinterleaveConfig& config);
    // `interleaved` holds channels * frames samples; no overlap with `planar`.
    void Process(const float* interleaved, float* const* planar, std::size_t frames) const noexcept;

    int GetChannelCount() const { return m_config.channels; }
    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }
    bool operator==(const Deinterleave& other) const { return m_config == other.m_config; }

private:
    using TwoKernel = void (*)(const float* interleaved, float* a, float* b, std::size_t frames);

    DeinterleaveConfig m_config;
    system::KernelForm m_form;
    TwoKernel m_two = nullptr;  // null: the reference loop
};

}  // namespace ora::numeric
