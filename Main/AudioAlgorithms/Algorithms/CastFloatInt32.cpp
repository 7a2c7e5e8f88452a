#include "Algorithms/CastFloatInt32.h"

#include <cmath>

namespace ora::numeric {

namespace kernels {

void FloatToInt32_ref(const float* in, std::int32_t* out, std::size_t n, float scale) {
    for (std::size_t i = 0; i < n; ++i) {
        float v = in[i] * scale;
        if (!(v == v)) v = 0.0f;
        v = v > kInt32Low ? v : kInt32Low;
        v = v < kInt32High ? v : kInt32High;
        out[i] = static_cast<std::int32_t>(std::lrint(v));
    }
}

void Int32ToFloat_ref(const std::int32_t* in, float* out, std::size_t n, float scale) {
    for (std::size_t i = 0; i < n; ++i) out[i] = static_cast<float>(in[i]) * scale;
}

}  // namespace kernels

CastFloatInt32::CastFloatInt32() : m_form(system::ChooseKernelFormWithoutFma()) {
    switch (m_form) {
        case system::KernelForm::M256:
            m_toInt = kernels::FloatToInt32_m256;
            m_toFloat = kernels::Int32ToFloat_m256;
            break;
        case system::KernelForm::M128:
            m_toInt = kernels::FloatToInt32_m128;
            m_toFloat = kernels::Int32ToFloat_m128;
            break;
        default:
            m_toInt = kernels::FloatToInt32_ref;
            m_toFloat = kernels::Int32ToFloat_ref;
            break;
    }
}

}  // namespace ora::numeric
