#include "Algorithms/ShaperIntegrals.h"

#include "Algorithms/simd/ShaperIntegralBodies.h"

namespace ora::numeric {

namespace simd {
void ShaperIntegrals_m256(const ShaperShape& shape, const float* pre, const float* in, double* u, double* f2,
                          std::size_t n);
}  // namespace simd

namespace {

void ShaperIntegrals_ref(const ShaperShape& shape, const float* pre, const float* in, double* u, double* f2,
                         std::size_t n) {
    simd::ShaperIntegralBlock<simd::PlainLanes>(shape, pre, in, u, f2, n);
}

}  // namespace

ShaperIntegrals::ShaperIntegrals() : m_form(system::ChooseKernelFormWithoutFma()) {
    m_kernel = m_form == system::KernelForm::M256 ? &simd::ShaperIntegrals_m256 : &ShaperIntegrals_ref;
    if (m_form != system::KernelForm::M256) m_form = system::KernelForm::Ref;
}

double ShaperIntegrals::Evaluate(const ShaperShape& shape, double u) noexcept {
    return simd::ShaperSecondIntegral<simd::PlainLanes>(shape, u);
}

}  // namespace ora::numeric
