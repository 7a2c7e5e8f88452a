#include "Waveshaper.h"

#include <QCoreApplication>
#include <algorithm>
#include <array>
#include <cmath>

namespace {

// Below this step between driven inputs the mean is the curve at the midpoint.
constexpr double kSmallStep = 1e-7;

double Sigmoid(double v) { return v / std::sqrt(1.0 + v * v); }

struct Tube {
    double gBias = Sigmoid(Waveshaper::kTubeBias);
    double scale = 1.0 / (1.0 + gBias);
    // Unit slope at 0: k g'(b) scale = 1, g'(v) = (1 + v^2)^-3/2.
    double k = std::pow(1.0 + Waveshaper::kTubeBias * Waveshaper::kTubeBias, 1.5) / scale;
};

const Tube& TubeConstants() {
    static const Tube tube;
    return tube;
}

}  // namespace

Waveshaper::Waveshaper() : ZenAudioAlgorithm(Definitions()) { SetChannelCount(1); }

const zen::ParameterTableDefinition& Waveshaper::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "Waveshaper",
        {
            ListParameter("CURVE", QT_TRANSLATE_NOOP("Waveshaper", "Curve"),
                          {QT_TRANSLATE_NOOP("Waveshaper", "Tape"), QT_TRANSLATE_NOOP("Waveshaper", "Tube"),
                           QT_TRANSLATE_NOOP("Waveshaper", "Hard"), QT_TRANSLATE_NOOP("Waveshaper", "Fold-back")},
                          static_cast<float>(kTube)),
        });
    return table;
}

double Waveshaper::TubeUpperLimit() {
    const Tube& t = TubeConstants();
    return (1.0 - t.gBias) * t.scale;
}

double Waveshaper::Apply(Curve curve, double u) noexcept {
    switch (curve) {
        case kTape: return Sigmoid(u);
        case kTube: {
            const Tube& t = TubeConstants();
            return (Sigmoid(t.k * u + kTubeBias) - t.gBias) * t.scale;
        }
        case kHard: return std::clamp(u, -1.0, 1.0);
        case kFoldBack: return std::sin(u);
    }
    return u;
}

double Waveshaper::Antiderivative(Curve curve, double u) noexcept {
    switch (curve) {
        case kTape: return std::sqrt(1.0 + u * u);
        case kTube: {
            const Tube& t = TubeConstants();
            const double v = t.k * u + kTubeBias;
            return (std::sqrt(1.0 + v * v) / t.k - t.gBias * u) * t.scale;
        }
        case kHard: {
            const double m = std::fabs(u);
            return m <= 1.0 ? 0.5 * u * u : m - 0.5;
        }
        case kFoldBack: return 1.0 - std::cos(u);
    }
    return 0.5 * u * u;
}

bool Waveshaper::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    if (index == kCurve) m_curve = static_cast<Curve>(std::clamp(static_cast<int>(std::lround(value)), 0, 3));
    return true;
}

void Waveshaper::SetChannelCount(std::uint64_t channels) {
    ZenAudioAlgorithm::SetChannelCount(channels);
    m_last.resize(channels, 0.0);
}

void Waveshaper::Reset() { std::fill(m_last.begin(), m_last.end(), 0.0); }

template <Waveshaper::Curve C>
float Waveshaper::ShapeWith(double& last, float* samples, const float* pre, const float* post,
                            std::uint64_t count) noexcept {
    double u0 = last;
    double f0 = Antiderivative(C, u0);
    double peak = 0.0;
    for (std::uint64_t i = 0; i < count; ++i) {
        const double u1 = static_cast<double>(pre[i]) * samples[i];
        const double f1 = Antiderivative(C, u1);
        const double step = u1 - u0;
        const double mean =
            std::fabs(step) > kSmallStep * (1.0 + std::fabs(u1)) ? (f1 - f0) / step : Apply(C, 0.5 * (u0 + u1));
        samples[i] = static_cast<float>(post[i] * mean);
        peak = std::max(peak, std::fabs(u1));
        u0 = u1;
        f0 = f1;
    }
    last = u0;
    return static_cast<float>(peak);
}

float Waveshaper::Shape(std::uint64_t channel, float* samples, const float* pre, const float* post,
                        std::uint64_t count) noexcept {
    double& last = m_last[channel];
    switch (m_curve) {
        case kTape: return ShapeWith<kTape>(last, samples, pre, post, count);
        case kTube: return ShapeWith<kTube>(last, samples, pre, post, count);
        case kHard: return ShapeWith<kHard>(last, samples, pre, post, count);
        case kFoldBack: return ShapeWith<kFoldBack>(last, samples, pre, post, count);
    }
    return 0.0f;
}

bool Waveshaper::ProcessChannel(std::uint64_t channel, float* samples, std::uint64_t count) {
    if (channel >= m_last.size()) return false;
    static const std::array<float, 64> kUnit = [] {
        std::array<float, 64> unit;
        unit.fill(1.0f);
        return unit;
    }();
    for (std::uint64_t done = 0; done < count; done += 64)
        Shape(channel, samples + done, kUnit.data(), kUnit.data(), std::min<std::uint64_t>(64, count - done));
    return true;
}

bool Waveshaper::Process(float* const* channels, std::uint64_t count) {
    for (std::uint64_t c = 0; c < m_last.size(); ++c) ProcessChannel(c, channels[c], count);
    return true;
}
