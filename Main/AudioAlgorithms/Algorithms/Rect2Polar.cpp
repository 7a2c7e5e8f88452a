#include "Algorithms/Rect2Polar.h"

#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/VecScalar.h"

namespace ora::numeric {

namespace kernels {

void Rect2Polar_ref(const float* bins, float* magnitude, float* phase, std::size_t n) {
    simd::Rect2Polar<VecScalar>(bins, magnitude, phase, n);
}

}  // namespace kernels

namespace {

kernels::Rect2PolarKernel FormKernel(system::KernelForm form) {
    switch (form) {
        case system::KernelForm::M256: return kernels::Rect2Polar_m256;
        case system::KernelForm::M128: return kernels::Rect2Polar_m128;
        default: return kernels::Rect2Polar_ref;
    }
}

}  // namespace

Rect2Polar::Rect2Polar() : m_form(system::ChooseKernelFormWithoutFma()), m_kernel(FormKernel(m_form)) {}

}  // namespace ora::numeric
