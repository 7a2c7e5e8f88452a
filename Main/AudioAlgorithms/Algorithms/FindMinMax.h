// Running minimum and maximum per channel: each block is merged with the
// values already held, until Reset. Channels are interleaved; the vector
// forms take one, two or four of them, `ref` any count. NaN samples are
// skipped. Before any sample, the minimum is +inf and the maximum -inf.
#pragma once

#include <cstddef>
#include <memory>
#include <vector>

#include "System/DispatchSettings.h"

namespace ora::numeric {

struct FindMinMaxConfig {
    int channels = 1;

    bool operator==(const FindMinMaxConfig& other) const { return channels == other.channels; }
};

class FindMinMaxImpl;

class FindMinMax {
public:
    explicit FindMinMax(const FindMinMaxConfig& config = {});
    ~FindMinMax();
    FindMinMax(const FindMinMax&) = delete;
    FindMinMax& operator=(const FindMinMax&) = delete;

    // Allocates; channels that stay keep their values.
    void Reconfigure(const FindMinMaxConfig& config);

    void Process(const float* interleaved, std::size_t frames) noexcept;
    void Reset() noexcept;

    float GetMin(int channel) const;
    float GetMax(int channel) const;
    // The larger magnitude of the two; 0 before any sample.
    float GetPeak(int channel) const;

    int GetChannelCount() const { return m_config.channels; }
    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }
    bool operator==(const FindMinMax& other) const { return m_config == other.m_config; }

private:
    FindMinMaxConfig m_config;
    system::KernelForm m_form;
    std::unique_ptr<FindMinMaxImpl> m_impl;
};

}  // namespace ora::numeric
