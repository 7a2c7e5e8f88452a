// 16 sine oscillators as rotating phasors, one per lane: each frame
//   (c, s) <- (c rc - s rs, s rc + c rs)
// and the new s of every lane goes out as a 16-float lane frame. The owner
// keeps the state (and renormalises it when it wishes). No fused forms, so
// every form gives the reference result bit for bit.
#pragma once

#include <cstddef>

#include "Algorithms/LaneFrame.h"
#include "Algorithms/simd/Rotor16Kernels.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

class Rotor16 {
public:
    Rotor16();

    // `frames` frames of sines; the state advances by as many steps.
    void Process(Rotor16State& state, float* sines, std::size_t frames) const noexcept {
        m_kernel(state, sines, frames);
    }

    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }

private:
    system::KernelForm m_form;
    kernels::Rotor16Kernel m_kernel;
};

}  // namespace ora::numeric
