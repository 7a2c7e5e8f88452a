// Autocorrelation of a block, as pitch and period detection and linear
// prediction use it:
//   r[k] = sum_{n < N - k} x[n] x[n + k],  k = 0 .. lags - 1,
// unnormalised, 0 for lags at or beyond the block's length N. Every form
// sums in n order from zero; the plain forms give the reference result bit
// for bit, the fused ones round each term once and stay within
// (N - k) 2^-22 sum |x[n] x[n + k]| of it.
#pragma once

#include <cstddef>

#include "Algorithms/simd/AutoCorrKernels.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

struct AutoCorrConfig {
    std::size_t lags = 1;  // r[0] .. r[lags - 1]

    bool operator==(const AutoCorrConfig& other) const { return lags == other.lags; }
};

class AutoCorr {
public:
    explicit AutoCorr(const AutoCorrConfig& config = {});

    void Reconfigure(const AutoCorrConfig& config) { m_config = config; }

    // Writes GetLagCount() values to r from the `frames` samples of x.
    void Process(const float* x, std::size_t frames, float* r) const noexcept { m_kernel(x, frames, r, m_config.lags); }

    std::size_t GetLagCount() const { return m_config.lags; }
    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }
    bool operator==(const AutoCorr& other) const { return m_config == other.m_config; }

private:
    AutoCorrConfig m_config;
    system::KernelForm m_form;
    kernels::AutoCorrKernel m_kernel;
};

}  // namespace ora::numeric
