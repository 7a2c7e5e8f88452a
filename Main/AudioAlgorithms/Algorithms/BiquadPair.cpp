#include "Algorithms/BiquadPair.h"

namespace ora::numeric {

namespace kernels {

void BiquadPair_ref(const BiquadSection* s, BiquadPairState& st, float* const* lanes, std::size_t laneCount,
                    std::size_t count) {
    constexpr double kGuard = 1e-18;
    for (std::size_t l = 0; l < laneCount; ++l) {
        double a1 = st.w1[0][l], a2 = st.w2[0][l], b1 = st.w1[1][l], b2 = st.w2[1][l];
        float* x = lanes[l];
        for (std::size_t f = 0; f < count; ++f) {
            double w = s[0].g * static_cast<double>(x[f]) + s[0].c0 * a2 + s[0].c1 * a1;
            const float middle = static_cast<float>(w + s[0].c2 * a2 + s[0].c3 * a1);
            a2 = a1;
            a1 = (w + kGuard) - kGuard;
            w = s[1].g * static_cast<double>(middle) + s[1].c0 * b2 + s[1].c1 * b1;
            x[f] = static_cast<float>(w + s[1].c2 * b2 + s[1].c3 * b1);
            b2 = b1;
            b1 = (w + kGuard) - kGuard;
        }
        st.w1[0][l] = a1;
        st.w2[0][l] = a2;
        st.w1[1][l] = b1;
        st.w2[1][l] = b2;
    }
}

}  // namespace kernels

namespace {

kernels::BiquadPairKernel FormKernel(system::KernelForm form) {
    switch (form) {
        case system::KernelForm::M256: return kernels::BiquadPair_m256;
        case system::KernelForm::M128: return kernels::BiquadPair_m128;
        default: return kernels::BiquadPair_ref;
    }
}

}  // namespace

BiquadPair::BiquadPair() : m_form(system::ChooseKernelFormWithoutFma()), m_kernel(FormKernel(m_form)) {}

}  // namespace ora::numeric
