// Left/right to mid/side: m = (l + r) / 2, s = (l - r) / 2. MS2LR undoes it.
// The form is chosen when the front is built; outputs may be the inputs.
#pragma once

#include <cstddef>

#include "Algorithms/simd/MidSideKernels.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

class LR2MS {
public:
    LR2MS();

    void Process(const float* l, const float* r, float* m, float* s, std::size_t frames) const noexcept {
        m_kernel(l, r, m, s, frames);
    }

    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }

private:
    system::KernelForm m_form;
    kernels::MidSideKernel m_kernel;
};

}  // namespace ora::numeric
