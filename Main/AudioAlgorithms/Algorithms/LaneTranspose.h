// Between the 16-float lane frames of the reverb's network and 16 planar
// rows: the network mixes across lanes frame by frame, while delay lines and
// gain matrices run along time. Pure data movement, so every form gives the
// reference result bit for bit.
#pragma once

#include <cstddef>

#include "Algorithms/simd/LaneTransposeKernels.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

class LaneTranspose {
public:
    LaneTranspose();

    // frames[f * 16 + k] = rows[k][f] for `frames` frames; no overlap.
    void ToFrames(const float* const* rows, float* frames, std::size_t count) const noexcept {
        m_kernels->toFrames(rows, frames, count);
    }
    // rows[k][f] = frames[f * 16 + k]; no overlap.
    void FromFrames(const float* frames, float* const* rows, std::size_t count) const noexcept {
        m_kernels->fromFrames(frames, rows, count);
    }

    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }

private:
    system::KernelForm m_form;
    const kernels::LaneTransposeKernels* m_kernels;
};

}  // namespace ora::numeric
