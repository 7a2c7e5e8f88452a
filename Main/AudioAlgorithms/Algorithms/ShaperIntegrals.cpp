#include "Algorithms/ShaperIntegrals.h"

#include "Algorithms/simd/ShaperIntegralBodies.h"

namespace ora::numeric {

namespace simd {
double ShaperIntegrals_m256(const ShaperShape& shape, const float* pre, const float* in, double* u, double* f2,
                            std::size_t n);
std::size_t ShaperMean_m256(const double* u, const double* f2, double smallStep, double* mean, unsigned char* small,
                            std::size_t n);
void ShaperScale_m256(const double* mean, const float* post, float* out, std::size_t n);
}  // namespace simd

namespace {

double ShaperIntegrals_ref(const ShaperShape& shape, const float* pre, const float* in, double* u, double* f2,
                           std::size_t n) {
    return simd::ShaperIntegralBlock<simd::PlainLanes>(shape, pre, in, u, f2, n);
}

std::size_t ShaperMean_ref(const double* u, const double* f2, double smallStep, double* mean, unsigned char* small,
                           std::size_t n) {
    return simd::ShaperMeanBlock<simd::PlainLanes>(u, f2, smallStep, mean, small, n);
}

void ShaperScale_ref(const double* mean, const float* post, float* out, std::size_t n) {
    simd::ShaperScaleBlock<simd::PlainLanes>(mean, post, out, n);
}

}  // namespace

ShaperIntegrals::ShaperIntegrals() : m_form(system::ChooseKernelFormWithoutFma()) {
    const bool wide = m_form == system::KernelForm::M256;
    m_kernel = wide ? &simd::ShaperIntegrals_m256 : &ShaperIntegrals_ref;
    m_mean = wide ? &simd::ShaperMean_m256 : &ShaperMean_ref;
    m_scale = wide ? &simd::ShaperScale_m256 : &ShaperScale_ref;
    if (m_form != system::KernelForm::M256) m_form = system::KernelForm::Ref;
}

double ShaperIntegrals::Evaluate(const ShaperShape& shape, double u) noexcept {
    return simd::ShaperSecondIntegral<simd::PlainLanes>(shape, u, simd::ShaperLogTable::Get());
}

}  // namespace ora::numeric
