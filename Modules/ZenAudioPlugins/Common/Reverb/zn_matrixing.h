// A gain matrix between two sets of channels or lanes, y[o] = sum_i G[o][i] x[i]
// per frame. A new matrix glides in linearly over kRampFrames frames (from
// wherever a glide in progress had got to), so gain changes never click; the
// first matrix after Dimension or Reset applies at once. Planar blocks (frames
// next to each other) with a settled matrix run on the Blas2 kernel, which
// sums each output over the inputs in the same order.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "Algorithms/Blas2.h"
#include "zn_matrixing_param.h"

namespace zen::reverb {

class zn_matrixing {
public:
    static constexpr std::uint32_t kRampFrames = 256;

    // All gains 0. Allocates.
    void Dimension(std::uint32_t inputs, std::uint32_t outputs);
    // Sizes must match the dimensions (a programming error otherwise; ignored).
    void Configure(const zn_matrixing_param& param) noexcept;
    void Configure(const ublas::matrix<float>& gains) noexcept;
    // Finishes any glide at the target.
    void Reset() noexcept;

    // Frame f, channel c of the input at in[f * inFrameStride + c * inChannelStride];
    // the output likewise. Overwrites the output.
    void Process(const float* in, std::size_t inFrameStride, std::size_t inChannelStride, float* out,
                 std::size_t outFrameStride, std::size_t outChannelStride, std::size_t frames) noexcept;

    std::uint32_t Inputs() const { return m_inputs; }
    std::uint32_t Outputs() const { return m_outputs; }
    float Gain(std::uint32_t output, std::uint32_t input) const { return m_current[output * m_inputs + input]; }
    bool Gliding() const { return m_remaining > 0; }

private:
    std::vector<float> m_current;  // outputs x inputs, row major
    std::vector<float> m_target;
    std::vector<float> m_step;
    std::uint32_t m_inputs = 0;
    std::uint32_t m_outputs = 0;
    std::uint32_t m_remaining = 0;
    bool m_configured = false;
    ora::numeric::Blas2 m_blas;
};

}  // namespace zen::reverb
