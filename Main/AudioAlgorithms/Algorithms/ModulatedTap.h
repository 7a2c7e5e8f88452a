// One tap of a delay line whose delay swings around a centre, read between
// samples by linear interpolation, for `count` frames:
//   p = max(1, delay + depth s[f]);  i = trunc(p);
//   v = weight (x[f - i] + (p - i) (x[f - i - 1] - x[f - i]));
//   out[f] = v, or out[f] + v when accumulating,
// where x[f] is the newest sample at frame f (the line is read back to
// x[f - i - 1]). No fused forms: every form gives the reference result bit
// for bit. The vector forms load runs whose whole delay stays put, which is
// nearly always, since the swing moves far less than a sample per frame.
#pragma once

#include <cstddef>

#include "Algorithms/simd/ModulatedTapKernels.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

class ModulatedTap {
public:
    ModulatedTap();

    void Read(const float* x, const float* s, float delay, float depth, float weight, float* out, std::size_t count,
              bool accumulate) const noexcept {
        m_kernel(x, s, delay, depth, weight, out, count, accumulate);
    }

    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }

private:
    system::KernelForm m_form;
    kernels::ModulatedTapKernel m_kernel;
};

}  // namespace ora::numeric
