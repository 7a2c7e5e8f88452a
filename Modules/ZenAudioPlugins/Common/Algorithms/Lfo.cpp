#include "Lfo.h"

#include <algorithm>
#include <cmath>

void Lfo::SetSampleRate(double sampleRate) noexcept {
    m_sampleRate = sampleRate;
    SetRate(m_rate);
}

void Lfo::SetRate(double hertz) noexcept {
    m_rate = hertz;
    // At most one cycle per sample, so the phase stays in [0, 1).
    m_increment = std::min(std::max(hertz, 0.0) / m_sampleRate, 0.5);
}

void Lfo::SetShape(Shape shape) noexcept {
    if (shape == m_shape) return;
    m_previousShape = m_shape;
    m_shape = shape;
    m_glideLeft = std::max(1u, static_cast<std::uint32_t>(std::lround(kShapeGlideSeconds * m_sampleRate)));
    m_glideStep = 1.0f / static_cast<float>(m_glideLeft);
}

void Lfo::Reset() noexcept {
    m_glideLeft = 0;
    m_phase = m_startPhase;
    m_seed = 1u + static_cast<std::uint32_t>(m_startPhase * 65536.0);
    m_from = Draw();
    m_to = Draw();
}

float Lfo::Draw() noexcept {
    m_seed = m_seed * 1664525u + 1013904223u;
    return static_cast<float>(m_seed >> 8) * (2.0f / 16777216.0f) - 1.0f;
}
