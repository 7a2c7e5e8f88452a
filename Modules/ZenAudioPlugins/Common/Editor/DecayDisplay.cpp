#include "DecayDisplay.h"

#include <algorithm>
#include <cmath>

#include "Common/Reverb/zn_reverb_u15.h"

using zen::reverb::zn_reverb;

namespace {

constexpr double kTwoPi = 6.283185307179586;
constexpr double kLowestHz = 20.0;
constexpr double kHighestHz = 20000.0;
constexpr double kHeadroom = 1.25;  // of the longest decay, above the curve

}  // namespace

DecayDisplay::DecayDisplay(const QString& title, RecordSetter setter, QWidget* parent)
    : CurveDisplay(title, [this](const zen::EditorLink& link, CurveDisplay&) { Read(link); }, parent),
      m_setter(std::move(setter)) {
    Plot().SetHorizontal(kLowestHz, kHighestHz, PlotArea::Scale::Logarithmic, "Hz");
    Plot().SetVertical(0.0, 2.0, "s");
}

DecayDisplay::~DecayDisplay() = default;

double DecayDisplay::LaneT60(double gain, double coefficient, double laneSeconds, double frequency,
                             double engineRate) {
    const double w = kTwoPi * frequency / engineRate;
    const double c = coefficient;
    const double damping = (1.0 + c) / std::sqrt(1.0 + 2.0 * c * std::cos(w) + c * c);
    const double perPass = std::log10(gain * damping);
    return perPass < 0.0 ? -3.0 * laneSeconds / perPass : INFINITY;
}

double DecayDisplay::T60At(const zn_reverb& engine, double frequency) {
    const auto& core = engine.Param().tail.core;
    double sum = 0.0;
    for (std::uint32_t i = 0; i < zen::reverb::zn_reverberant_u15_core_param::kLines; ++i)
        sum += LaneT60(core.gains(i), core.coefficients(i), engine.LaneTime(i), frequency, engine.SampleRate());
    return sum / zen::reverb::zn_reverberant_u15_core_param::kLines;
}

void DecayDisplay::Read(const zen::EditorLink& link) {
    const float hostRate = link.GetSampleRate();
    if (!m_engine || hostRate != m_hostRate) {
        m_engine = std::make_unique<zn_reverb>(zen::reverb::zn_reverb_u15::EngineRateFor(hostRate), 1, 1);
        m_hostRate = hostRate;
    }
    m_setter(link, *m_engine);
    const bool first = Curves().empty();
    if (!m_engine->Update() && !first) return;

    const double top = std::min(kHighestHz, m_engine->SampleRate() / 2.0);
    std::vector<QPointF> points;
    double longest = 0.0;
    for (double f : Plot().SamplePositions(kCurvePoints)) {
        if (f > top) break;
        const double t60 = T60At(*m_engine, f);
        longest = std::max(longest, t60);
        points.emplace_back(f, t60);
    }
    const double maximum = std::max(0.5, std::ceil(longest * kHeadroom * 2.0) / 2.0);
    if (maximum != m_shownMaximum) {
        Plot().SetVertical(0.0, maximum, "s");
        m_shownMaximum = maximum;
    }
    SetCurve(0, std::move(points), tr("Decay time"));
}
