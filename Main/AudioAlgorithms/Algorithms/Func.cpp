#include "Algorithms/Func.h"

#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/VecScalar.h"

namespace ora::numeric {

namespace kernels {

const FuncKernels kFunc_ref = simd::FuncTable<VecScalar>();

}  // namespace kernels

namespace {

const kernels::FuncKernels* FormKernels(system::KernelForm form) {
    switch (form) {
        case system::KernelForm::M256Fma: return &kernels::kFunc_m256_fma;
        case system::KernelForm::M256: return &kernels::kFunc_m256;
        case system::KernelForm::M128Fma: return &kernels::kFunc_m128_fma;
        case system::KernelForm::M128: return &kernels::kFunc_m128;
        default: return &kernels::kFunc_ref;
    }
}

}  // namespace

Func::Func() : m_form(system::ChooseKernelForm()), m_kernels(FormKernels(m_form)) {}

}  // namespace ora::numeric
