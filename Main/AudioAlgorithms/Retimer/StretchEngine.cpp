#include "Retimer/StretchEngine.h"

#include <algorithm>
#include <cmath>

namespace ora::fft::stretch::pv {

Engine::Engine(const EngineParam& param) : m_param(param) {
    m_in2dft.SetTimeWeighted(true);
    ApplySettings();
}

bool Engine::Configure(std::size_t channels, std::size_t inputCapacity, Backend backend) {
    m_channels = 0;
    if (!m_param.IsValid()) return false;
    EngineConfig config;
    config.channels = channels;
    config.sharedRow = true;
    config.frameLength = m_param.FrameLength();
    config.fftLength = m_param.FftLength();
    config.hop = m_param.Hop();
    config.inputCapacity = inputCapacity;
    config.backend = backend;
    config.gain = m_param.Gain();
    config.inputLimit = kLargestInput;
    config.pipeline = {&m_in2dft, &m_rect2polar, &m_phaseGrad, &m_pghi, &m_plpv, &m_polar2rect, &m_dft2out};
    if (config.pipeline.size() > m_param.PipelineCapacity() || !m_engine.Configure(config)) return false;
    m_channels = channels;
    ApplySettings();
    Reset();
    return true;
}

void Engine::Reset() noexcept {
    m_engine.Reset();
    m_dry = m_dryTarget;
    m_wet = m_wetTarget;
    m_rampLeft = 0;
}

void Engine::ApplySettings() noexcept {
    SetAlgorithm(m_param.algorithm);
    SetMode(m_param.mode);
    SetJoint(m_param.joint);
    SetLog10Eps(m_param.log10Eps);
    SetMaxPeak(m_param.maxPeak);
    SetLog10Tol(m_param.log10Tol);
}

void Engine::SetAlgorithm(Algorithm algorithm) noexcept {
    m_pghi.SetEnabled(algorithm == Algorithm::PGHI);
    m_plpv.SetEnabled(algorithm == Algorithm::PLPV);
}

void Engine::SetMode(Mode mode) noexcept {
    switch (mode) {
        case Mode::PG: m_phaseGrad.SetMode(PhaseGrad::Mode::PG); break;
        case Mode::PV: m_phaseGrad.SetMode(PhaseGrad::Mode::PV); break;
        default: m_phaseGrad.SetMode(PhaseGrad::Mode::Auto); break;
    }
}

void Engine::SetReadRate(double rate) noexcept {
    Context& context = m_engine.GetContext();
    context.bandLimit = rate > 1.0 ? static_cast<std::size_t>(static_cast<double>(context.bins - 1) / rate) : 0;
}

void Engine::SetMix(float dry, float wet) noexcept {
    m_dryTarget = dry;
    m_wetTarget = wet;
    m_rampLeft = kMixRamp;
    m_dryStep = (m_dryTarget - m_dry) / static_cast<float>(kMixRamp);
    m_wetStep = (m_wetTarget - m_wet) / static_cast<float>(kMixRamp);
}

void Engine::MixOutput(float* const* out, std::int64_t inputStart, std::size_t frames) noexcept {
    const std::vector<Buffer>& in = *m_engine.GetContext().in;
    float dry = m_dry;
    float wet = m_wet;
    std::size_t left = m_rampLeft;
    for (std::size_t c = 0; c < m_channels; ++c) {
        dry = m_dry;
        wet = m_wet;
        left = m_rampLeft;
        float* o = out[c];
        for (std::size_t i = 0; i < frames; ++i) {
            if (left > 0) {
                dry += m_dryStep;
                wet += m_wetStep;
                if (--left == 0) {
                    dry = m_dryTarget;
                    wet = m_wetTarget;
                }
            }
            const float x = dry != 0.0f ? in[c].At(inputStart + static_cast<std::int64_t>(i)) : 0.0f;
            o[i] = wet * o[i] + dry * x;
        }
    }
    m_dry = dry;
    m_wet = wet;
    m_rampLeft = left;
}

std::int64_t Engine::LastGradientMask() {
    const std::int64_t* mask = m_engine.GetFrame().Int(variable::MASK);
    return mask != nullptr ? *mask : 0;
}

}  // namespace ora::fft::stretch::pv
