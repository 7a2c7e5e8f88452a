// The FIR filter in its symmetric (linear-phase) form: h[k] = h[length-1-k],
// so each pair of inputs shares one multiplication. Given the first half of
// the coefficients (the middle one included for an odd length); a shorter
// half is padded with zeros. Same forms, dispatch ladder, reconfiguration
// and hand-over of history as FIR.
#pragma once

#include <cstddef>
#include <memory>
#include <vector>

#include "System/DispatchSettings.h"

namespace ora::numeric {

struct FIRSConfig {
    int channels = 1;
    std::vector<float> half = {1.0f};  // h[0] .. h[(length - 1) / 2]
    std::size_t length = 1;

    bool operator==(const FIRSConfig& other) const {
        return channels == other.channels && half == other.half && length == other.length;
    }
};

class FIRSImpl;

class FIRS {
public:
    explicit FIRS(const FIRSConfig& config = {});
    ~FIRS();
    FIRS(const FIRS&) = delete;
    FIRS& operator=(const FIRS&) = delete;

    // Allocates.
    void Reconfigure(const FIRSConfig& config);

    // Planar channels, GetChannelCount() of them; `out` may be `in`.
    void Process(const float* const* in, float* const* out, std::size_t frames) noexcept;
    void Process(const float* in, float* out, std::size_t frames) noexcept { Process(&in, &out, frames); }
    void Reset() noexcept;

    const FIRSConfig& GetConfig() const { return m_config; }
    int GetChannelCount() const { return m_config.channels; }
    // (length - 1) / 2 samples, rounded down: the delay of the linear phase.
    std::size_t GetLatency() const { return (m_config.length - 1) / 2; }
    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }
    bool operator==(const FIRS& other) const { return m_config == other.m_config; }

private:
    FIRSConfig m_config;
    system::KernelForm m_form;
    std::unique_ptr<FIRSImpl> m_impl;
};

}  // namespace ora::numeric
