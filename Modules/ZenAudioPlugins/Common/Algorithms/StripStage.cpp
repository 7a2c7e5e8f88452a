#include "StripStage.h"

#include <algorithm>
#include <cmath>

namespace zen {

StripStage::StripStage(ZenAudioAlgorithm& algorithm, Measure measure) : m_algorithm(algorithm), m_measure(measure) {}

void StripStage::Prepare(std::uint32_t channels, std::uint32_t maxSegment) {
    m_segment = maxSegment;
    m_input.assign(static_cast<std::size_t>(std::min(channels, kMaxChannels)) * maxSegment, 0.0f);
    Reset();
}

void StripStage::Reset() noexcept {
    m_running = false;
    m_peak = 0.0f;
}

float StripStage::TakePeak() noexcept {
    const float peak = m_peak;
    m_peak = 0.0f;
    return peak;
}

void StripStage::Process(float* const* channels, std::uint32_t channelCount, std::uint32_t offset, std::uint32_t count,
                         const SmoothedRamp& fade) noexcept {
    channelCount = std::min(channelCount, kMaxChannels);
    if (count == 0 || count > m_segment) return;
    if (fade.Holds(0.0f, offset, count)) {
        m_running = false;
        return;
    }
    if (!m_running) m_algorithm.Reset();
    m_running = true;

    const bool blend = !fade.Holds(1.0f, offset, count);
    const bool keepInput = blend || m_measure == Measure::kChange;
    float* part[kMaxChannels] = {};
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        part[c] = channels[c] + offset;
        if (keepInput) std::copy_n(part[c], count, m_input.data() + c * m_segment);
    }
    m_algorithm.Process(part, count);

    for (std::uint32_t c = 0; c < channelCount; ++c) {
        const float* x = m_input.data() + c * m_segment;
        float* y = part[c];
        if (blend)
            for (std::uint32_t i = 0; i < count; ++i) y[i] = x[i] + fade[offset + i] * (y[i] - x[i]);
        if (m_measure == Measure::kNothing) continue;
        for (std::uint32_t i = 0; i < count; ++i) {
            const float level = std::fabs(m_measure == Measure::kChange ? y[i] - x[i] : y[i]);
            if (level > m_peak && std::isfinite(level)) m_peak = level;
        }
    }
}

}  // namespace zen
