#include "Waveshaper.h"

#include <QCoreApplication>
#include <algorithm>
#include <array>
#include <cmath>

namespace {

// Below this step between driven inputs (relative to their size) the
// differences of the second antiderivative lose too many digits to divide,
// and the curve at the midpoint is as close.
constexpr double kSmallStep = 1e-5;
// Below this driven level every curve is a straight line of unit slope
// through 0 to within 1e-12: its triangle-weighted mean is that of the inputs.
constexpr double kStraightBelow = 1e-6;

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
    if (index == kCurve) {
        m_curve = static_cast<Curve>(std::clamp(static_cast<int>(std::lround(value)), 0, 3));
        m_shape = IntegralShape(m_curve);
    }
    return true;
}

void Waveshaper::SetChannelCount(std::uint64_t channels) {
    ZenAudioAlgorithm::SetChannelCount(channels);
    m_history.resize(channels, History{});
}

void Waveshaper::Reset() { std::fill(m_history.begin(), m_history.end(), History{}); }

ora::numeric::ShaperShape Waveshaper::IntegralShape(Curve curve) {
    using ora::numeric::ShaperCurve;
    switch (curve) {
        case kTape: return {ShaperCurve::Tape};
        case kTube: {
            const Tube& t = TubeConstants();
            return {ShaperCurve::Tube, t.k, kTubeBias, t.gBias, t.scale};
        }
        case kHard: return {ShaperCurve::Hard};
        case kFoldBack: return {ShaperCurve::FoldBack};
    }
    return {};
}

double Waveshaper::SecondAntiderivative(Curve curve, double u) noexcept {
    return ora::numeric::ShaperIntegrals::Evaluate(IntegralShape(curve), u);
}

namespace {

// The curve's first antiderivative averaged over the step from b to a,
// (F2(a) - F2(b)) / (a - b), kept as a fraction so that the output costs one
// division; taken at the midpoint when the step is too small to divide by.
struct StepMean {
    double numerator, denominator;
};

template <Waveshaper::Curve C>
inline StepMean MeanOverStep(double a, double b, double f2a, double f2b) noexcept {
    const double step = a - b;
    if (std::fabs(step) > kSmallStep * (1.0 + std::fabs(a))) return {f2a - f2b, step};
    return {Waveshaper::Antiderivative(C, 0.5 * (a + b)), 1.0};
}

}  // namespace

template <Waveshaper::Curve C>
float Waveshaper::ShapeWith(History& h, float* samples, const float* pre, const float* post,
                            std::uint64_t count) noexcept {
    // Driven inputs and their F2 a chunk at a time, behind the last two of the chunk before.
    std::array<double, kChunk + 2> u, f2;
    std::array<double, kChunk> mean;
    std::array<unsigned char, kChunk> small;
    u[0] = h.u2;
    u[1] = h.u1;
    // Only the inputs are kept between blocks, so a change of curve starts clean.
    f2[0] = SecondAntiderivative(C, u[0]);
    f2[1] = SecondAntiderivative(C, u[1]);
    double peak = 0.0;
    for (std::uint64_t done = 0; done < count; done += kChunk) {
        const std::size_t n = static_cast<std::size_t>(std::min<std::uint64_t>(kChunk, count - done));
        float* x = samples + done;
        peak = std::max(peak, m_integrals.Evaluate(m_shape, pre + done, x, u.data() + 2, f2.data() + 2, n));
        const std::size_t flagged = m_integrals.Mean(u.data(), f2.data(), kSmallStep, mean.data(), small.data(), n);
        for (std::size_t i = 0; i < n && flagged > 0; ++i) {
            if (small[i] != 0) {
                double& m = mean[i];
                const double u0 = u[i + 2], u1 = u[i + 1], u2 = u[i];
                if (std::max({std::fabs(u0), std::fabs(u1), std::fabs(u2)}) < kStraightBelow) {
                    m = (4.0 * u1 + u0 + u2) / 6.0;  // silence and the ends of decays, cheaply
                    continue;
                }
                const StepMean d01 = MeanOverStep<C>(u0, u1, f2[i + 2], f2[i + 1]);
                const StepMean d12 = MeanOverStep<C>(u1, u2, f2[i + 1], f2[i]);
                const double span = u0 - u2;
                if (std::fabs(span) > kSmallStep * (1.0 + std::fabs(u0))) {
                    m = 2.0 * (d01.numerator * d12.denominator - d12.numerator * d01.denominator) /
                        (d01.denominator * d12.denominator * span);
                } else {
                    // The triangle folds onto the line from u1 to the ends' midpoint.
                    const double middle = 0.5 * (u0 + u2);
                    const double half = middle - u1;
                    m = std::fabs(half) > kSmallStep * (1.0 + std::fabs(u1))
                            ? 2.0 / half *
                                  (Antiderivative(C, middle) + (f2[i + 1] - SecondAntiderivative(C, middle)) / half)
                            : Apply(C, 0.5 * (middle + u1));
                }
            }
        }
        // The mean of the curve lies within its range; rounding of huge inputs may not.
        m_integrals.Scale(mean.data(), post + done, x, n);
        u[0] = u[n];
        u[1] = u[n + 1];
        f2[0] = f2[n];
        f2[1] = f2[n + 1];
    }
    h = {u[1], u[0]};
    return static_cast<float>(peak);
}

float Waveshaper::Shape(std::uint64_t channel, float* samples, const float* pre, const float* post,
                        std::uint64_t count) noexcept {
    History& h = m_history[channel];
    switch (m_curve) {
        case kTape: return ShapeWith<kTape>(h, samples, pre, post, count);
        case kTube: return ShapeWith<kTube>(h, samples, pre, post, count);
        case kHard: return ShapeWith<kHard>(h, samples, pre, post, count);
        case kFoldBack: return ShapeWith<kFoldBack>(h, samples, pre, post, count);
    }
    return 0.0f;
}

bool Waveshaper::ProcessChannel(std::uint64_t channel, float* samples, std::uint64_t count) {
    if (channel >= m_history.size()) return false;
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
    for (std::uint64_t c = 0; c < m_history.size(); ++c) ProcessChannel(c, channels[c], count);
    return true;
}
