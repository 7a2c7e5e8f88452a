#include "Retimer/PitchShiftEngine.h"

#include <cmath>

namespace ora::pitchshift {

double Engine::Ratio(std::int32_t coarse, float fine) {
    return std::pow(2.0, (static_cast<double>(coarse) * 100.0 + static_cast<double>(fine)) * (1.0 / 1200.0));
}

double Engine::MinRatio() { return std::pow(2.0, -kMaxCents / 1200.0); }
double Engine::MaxRatio() { return std::pow(2.0, kMaxCents / 1200.0); }

std::size_t Engine::LatencyFor(const EngineParam& param) {
    return static_cast<std::size_t>(retimer::Engine::LatencyFor(param.m_stretch, param.m_rateControl, MinRatio()));
}

Engine::Engine(EngineParam& param)
    : m_param(param), m_retimer(param.m_stretch, param.m_interp, param.m_rateControl) {}

bool Engine::Configure(std::size_t channels, fft::Backend backend) {
    m_channels = 0;
    if (!m_retimer.Configure(channels, MinRatio(), MaxRatio(), backend)) return false;
    m_channels = channels;
    Apply(m_applied, 0);
    return Reset();
}

bool Engine::Reset() noexcept { return m_retimer.Reset(); }

std::uint32_t Engine::Changes(const Settings& wanted) const {
    std::uint32_t bits = 0;
    if (std::abs(static_cast<double>(wanted.coarse - m_applied.coarse)) > kChangeEpsilon ||
        std::abs(static_cast<double>(wanted.fine) - m_applied.fine) > kChangeEpsilon)
        bits |= kPitchChanged;
    if (std::abs(static_cast<double>(wanted.dryWet) - m_applied.dryWet) > kChangeEpsilon) bits |= kMixChanged;
    if (wanted.algorithmType != m_applied.algorithmType || wanted.algorithmMode != m_applied.algorithmMode)
        bits |= kAlgorithmChanged;
    return bits;
}

void Engine::Apply(const Settings& wanted, std::uint32_t changes) noexcept {
    m_pending |= changes;
    auto& stretch = m_retimer.Stretch();
    while (m_pending != 0) {
        if (m_pending & kPitchChanged) {
            m_param.m_interp.m_OutputRatio = static_cast<float>(Ratio(wanted.coarse, wanted.fine));
            m_retimer.ParametersChanged();
            m_applied.coarse = wanted.coarse;
            m_applied.fine = wanted.fine;
            m_pending &= ~std::uint32_t{kPitchChanged};
        } else if (m_pending & kMixChanged) {
            const float wet = wanted.dryWet * 0.01f;
            stretch.SetMix(1.0f - wet, wet);
            m_applied.dryWet = wanted.dryWet;
            m_pending &= ~std::uint32_t{kMixChanged};
        } else {
            using fft::stretch::pv::Algorithm;
            using fft::stretch::pv::Mode;
            if (wanted.algorithmType == 0 || wanted.algorithmType == 1) {
                m_param.m_stretch.algorithm = static_cast<Algorithm>(wanted.algorithmType);
                stretch.SetAlgorithm(m_param.m_stretch.algorithm);
            }
            const int mode = wanted.algorithmMode == 0 ? 0 : wanted.algorithmMode == 1 ? 1 : 2;
            m_param.m_stretch.mode = static_cast<Mode>(mode);
            stretch.SetMode(m_param.m_stretch.mode);
            m_applied.algorithmType = wanted.algorithmType;
            m_applied.algorithmMode = wanted.algorithmMode;
            m_pending &= std::uint32_t{kPitchChanged | kMixChanged};
        }
    }
}

void Engine::ForgetSettings() noexcept {
    m_applied.dryWet = 100.0f;
    m_pending = 0;
}

void Engine::SetJoint(bool joint) noexcept {
    m_param.m_stretch.joint = joint;
    m_retimer.Stretch().SetJoint(joint);
}

void Engine::SetLog10Eps(float value) noexcept {
    m_param.m_stretch.log10Eps = value;
    m_retimer.Stretch().SetLog10Eps(value);
}

void Engine::SetMaxPeak(int value) noexcept {
    m_param.m_stretch.maxPeak = value;
    m_retimer.Stretch().SetMaxPeak(value);
}

void Engine::SetLog10Tol(float value) noexcept {
    m_param.m_stretch.log10Tol = value;
    m_retimer.Stretch().SetLog10Tol(value);
}

bool Engine::Process(const float* const* in, float* const* out, std::size_t frames) noexcept {
    retimer::Block input{const_cast<float* const*>(in), m_channels, frames};
    retimer::Block output{out, m_channels, frames};
    return m_retimer.Process(input, output);
}

}  // namespace ora::pitchshift
