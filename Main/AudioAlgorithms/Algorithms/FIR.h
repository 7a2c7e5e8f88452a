// Finite-impulse-response filter over a delay line: y[n] = sum_k h[k] x[n-k],
// for one or two channels in the vector forms and any count in `ref`.
//
// The form is chosen when the front is built (FIR_c1/c2_m256_fma, _m256,
// _m128_fma, _m128, FIR_ref). Reconfiguring with the same channel count
// swaps the coefficients in place; a new channel count rebuilds the
// implementation, which takes over the old one's history. Processing never
// allocates; blocks may be processed in place.
#pragma once

#include <cstddef>
#include <memory>
#include <vector>

#include "System/DispatchSettings.h"

namespace ora::numeric {

class FilterHistory;

struct FIRConfig {
    int channels = 1;
    std::vector<float> coefficients = {1.0f};  // h[0] first; at least one

    bool operator==(const FIRConfig& other) const {
        return channels == other.channels && coefficients == other.coefficients;
    }
};

class FIRImpl;

class FIR {
public:
    explicit FIR(const FIRConfig& config = {});
    ~FIR();
    FIR(const FIR&) = delete;
    FIR& operator=(const FIR&) = delete;

    // Allocates.
    void Reconfigure(const FIRConfig& config);

    // Planar channels, GetChannelCount() of them; `out` may be `in`.
    void Process(const float* const* in, float* const* out, std::size_t frames) noexcept;
    // One channel.
    void Process(const float* in, float* out, std::size_t frames) noexcept { Process(&in, &out, frames); }
    // Clears the history.
    void Reset() noexcept;

    const FIRConfig& GetConfig() const { return m_config; }
    int GetChannelCount() const { return m_config.channels; }
    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }
    // Same configuration (the forms may differ).
    bool operator==(const FIR& other) const { return m_config == other.m_config; }

private:
    FIRConfig m_config;
    system::KernelForm m_form;
    std::unique_ptr<FIRImpl> m_impl;
};

}  // namespace ora::numeric
