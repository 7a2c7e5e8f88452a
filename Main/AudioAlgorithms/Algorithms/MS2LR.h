// Mid/side to left/right: l = m + s, r = m - s, the inverse of LR2MS.
// The form is chosen when the front is built; outputs may be the inputs.
#pragma once

#include <cstddef>

#include "Algorithms/simd/MidSideKernels.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

class MS2LR {
public:
    MS2LR();

    void Process(const float* m, const float* s, float* l, float* r, std::size_t frames) const noexcept {
        m_kernel(m, s, l, r, frames);
    }

    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }

private:
    system::KernelForm m_form;
    kernels::MidSideKernel m_kernel;
};

}  // namespace ora::numeric
