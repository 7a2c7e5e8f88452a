#include "Algorithms/BiquadLanes.h"

namespace ora::numeric {

namespace kernels {

void BiquadLanes_ref(BiquadLane* const* lanes, float* const* buffers, std::size_t laneCount, std::size_t count) {
    constexpr double kGuard = 1e-18;
    for (std::size_t l = 0; l < laneCount; ++l) {
        BiquadLane& lane = *lanes[l];
        const BiquadSection* s = lane.sections;
        double a1 = lane.w1[0], a2 = lane.w2[0], b1 = lane.w1[1], b2 = lane.w2[1];
        float* x = buffers[l];
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
        lane.w1[0] = a1;
        lane.w2[0] = a2;
        lane.w1[1] = b1;
        lane.w2[1] = b2;
    }
}

}  // namespace kernels

namespace {

kernels::BiquadLanesKernel FormKernel(system::KernelForm form) {
    switch (form) {
        case system::KernelForm::M256: return kernels::BiquadLanes_m256;
        case system::KernelForm::M128: return kernels::BiquadLanes_m128;
        default: return kernels::BiquadLanes_ref;
    }
}

}  // namespace

BiquadLanes::BiquadLanes() : m_form(system::ChooseKernelFormWithoutFma()), m_kernel(FormKernel(m_form)) {}

}  // namespace ora::numeric
