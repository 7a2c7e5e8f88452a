#include "zn_matrixing.h"

#include <algorithm>

#include "Common/ZenAssert.h"

namespace zen::reverb {

void zn_matrixing::Dimension(std::uint32_t inputs, std::uint32_t outputs) {
    m_inputs = inputs;
    m_outputs = outputs;
    const std::size_t size = static_cast<std::size_t>(inputs) * outputs;
    m_current.assign(size, 0.0f);
    m_target.assign(size, 0.0f);
    m_step.assign(size, 0.0f);
    m_remaining = 0;
    m_configured = false;
}

void zn_matrixing::Configure(const zn_matrixing_param& param) noexcept {
    if (param.inputs != m_inputs || param.outputs != m_outputs) {
        ZEN_ASSERT(false, "param.inputs == m_inputs && param.outputs == m_outputs");
        return;
    }
    Configure(param.gains);
}

void zn_matrixing::Configure(const ublas::matrix<float>& gains) noexcept {
    if (gains.size1() != m_outputs || gains.size2() != m_inputs) {
        ZEN_ASSERT(false, "gains.size1() == m_outputs && gains.size2() == m_inputs");
        return;
    }
    bool changed = false;
    for (std::uint32_t o = 0; o < m_outputs; ++o)
        for (std::uint32_t i = 0; i < m_inputs; ++i) {
            const float g = gains(o, i);
            changed |= g != m_target[o * m_inputs + i];
            m_target[o * m_inputs + i] = g;
        }
    if (!m_configured) {
        m_configured = true;
        Reset();
        return;
    }
    if (!changed) return;
    for (std::size_t k = 0; k < m_target.size(); ++k)
        m_step[k] = (m_target[k] - m_current[k]) / static_cast<float>(kRampFrames);
    m_remaining = kRampFrames;
}

void zn_matrixing::Reset() noexcept {
    std::copy(m_target.begin(), m_target.end(), m_current.begin());
    m_remaining = 0;
}

void zn_matrixing::Process(const float* in, std::size_t inFrameStride, std::size_t inChannelStride, float* out,
                           std::size_t outFrameStride, std::size_t outChannelStride, std::size_t frames) noexcept {
    std::size_t f = 0;
    for (; f < frames && (m_remaining > 0 || inFrameStride != 1 || outFrameStride != 1); ++f) {
        if (m_remaining > 0) {
            if (--m_remaining == 0) {
                std::copy(m_target.begin(), m_target.end(), m_current.begin());
            } else {
                for (std::size_t k = 0; k < m_current.size(); ++k) m_current[k] += m_step[k];
            }
        }
        const float* x = in + f * inFrameStride;
        float* y = out + f * outFrameStride;
        const float* row = m_current.data();
        for (std::uint32_t o = 0; o < m_outputs; ++o, row += m_inputs) {
            float acc = 0.0f;
            for (std::uint32_t i = 0; i < m_inputs; ++i) acc += row[i] * x[i * inChannelStride];
            y[o * outChannelStride] = acc;
        }
    }
    if (f == frames) return;
    for (std::uint32_t o = 0; o < m_outputs; ++o)
        m_blas.Gemv(in + f, frames - f, m_inputs, inChannelStride, m_current.data() + o * m_inputs,
                    out + o * outChannelStride + f);
}

}  // namespace zen::reverb
