// Conversion between float samples and 32-bit integers, for PCM I/O and
// integer arithmetic. To integers: x * scale rounded to nearest (ties to
// even), saturated to the int32 range, NaN to 0. To floats: i * scale.
#pragma once

#include <cstddef>
#include <cstdint>

#include "Algorithms/simd/CastFloatInt32Kernels.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

class CastFloatInt32 {
public:
    // Full-scale float to full-scale 32-bit PCM and back.
    static constexpr float kPcm32Scale = 2147483648.0f;

    CastFloatInt32();

    void ToInt32(const float* in, std::int32_t* out, std::size_t n, float scale) const noexcept {
        m_toInt(in, out, n, scale);
    }
    void ToFloat(const std::int32_t* in, float* out, std::size_t n, float scale) const noexcept {
        m_toFloat(in, out, n, scale);
    }

    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }

private:
    system::KernelForm m_form;
    kernels::ToInt32Kernel m_toInt;
    kernels::ToFloatKernel m_toFloat;
};

}  // namespace ora::numeric
