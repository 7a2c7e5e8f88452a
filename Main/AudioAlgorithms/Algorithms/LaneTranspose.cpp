#include "Algorithms/LaneTranspose.h"

#include "Algorithms/LaneFrame.h"

namespace ora::numeric {

namespace kernels {

namespace {

void ToFrames(const float* const* rows, float* frames, std::size_t count) {
    for (std::size_t f = 0; f < count; ++f)
        for (std::size_t k = 0; k < kLaneCount; ++k) frames[f * kLaneCount + k] = rows[k][f];
}

void FromFrames(const float* frames, float* const* rows, std::size_t count) {
    for (std::size_t k = 0; k < kLaneCount; ++k)
        for (std::size_t f = 0; f < count; ++f) rows[k][f] = frames[f * kLaneCount + k];
}

}  // namespace

const LaneTransposeKernels kLaneTranspose_ref = {ToFrames, FromFrames};

}  // namespace kernels

namespace {

const kernels::LaneTransposeKernels* FormKernels(system::KernelForm form) {
    switch (form) {
        case system::KernelForm::M256: return &kernels::kLaneTranspose_m256;
        case system::KernelForm::M128: return &kernels::kLaneTranspose_m128;
        default: return &kernels::kLaneTranspose_ref;
    }
}

}  // namespace

LaneTranspose::LaneTranspose() : m_form(system::ChooseKernelFormWithoutFma()), m_kernels(FormKernels(m_form)) {}

}  // namespace ora::numeric
