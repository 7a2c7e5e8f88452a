// Linear-congruential random generator for noise and dither: the state steps
// as state * 1664525 + 1013904223 (mod 2^32) and each value is the state read
// as a signed integer, scaled to [-1, 1]. Every form produces the same
// sequence (the vector forms jump several steps at once), so a seed always
// gives the same noise.
#pragma once

#include <cstddef>
#include <cstdint>

#include "Algorithms/simd/LCGKernels.h"
#include "System/DispatchSettings.h"

namespace ora::numeric::random {

struct LCGConfig {
    std::uint32_t seed = 1;

    bool operator==(const LCGConfig& other) const { return seed == other.seed; }
};

class LCG {
public:
    explicit LCG(const LCGConfig& config = {});

    // Restarts from the new seed.
    void Reconfigure(const LCGConfig& config);

    void Generate(float* out, std::size_t n) noexcept { m_state = m_kernel(m_state, out, n); }
    float Next() noexcept;

    std::uint32_t GetState() const { return m_state; }
    void SetState(std::uint32_t state) { m_state = state; }
    system::IntegerKernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }
    bool operator==(const LCG& other) const { return m_config == other.m_config; }

private:
    LCGConfig m_config;
    system::IntegerKernelForm m_form;
    kernels::LcgKernel m_kernel;
    std::uint32_t m_state;
};

}  // namespace ora::numeric::random
