// Weighted sum of buffers: out[n] = sum_i weights[i] * sources[i][n], summed
// in source order. The form is chosen when the front is built; `out` may be
// one of the sources.
#pragma once

#include <cstddef>
#include <vector>

#include "Algorithms/simd/MixKernels.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

struct MixConfig {
    std::vector<float> weights;  // one per source

    bool operator==(const MixConfig& other) const { return weights == other.weights; }
};

class Mix {
public:
    explicit Mix(const MixConfig& config = {});

    // Allocates.
    void Reconfigure(const MixConfig& config) { m_config = config; }

    // GetSourceCount() sources of `frames` samples.
    void Process(const float* const* sources, float* out, std::size_t frames) const noexcept {
        m_kernel(sources, m_config.weights.data(), m_config.weights.size(), out, frames);
    }

    std::size_t GetSourceCount() const { return m_config.weights.size(); }
    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }
    bool operator==(const Mix& other) const { return m_config == other.m_config; }

private:
    MixConfig m_config;
    system::KernelForm m_form;
    kernels::MixKernel m_kernel;
};

}  // namespace ora::numeric
