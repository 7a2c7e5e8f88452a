#include "LfoDisplay.h"

#include <algorithm>
#include <cmath>

#include "Common/Algorithms/Lfo.h"
#include "Common/Algorithms/LfoRate.h"
#include "ZenEditor.h"

LfoDisplay::LfoDisplay(const QString& title, std::uint32_t rate, std::uint32_t sync, std::uint32_t tempo,
                       std::uint32_t shape, QWidget* parent)
    : CurveDisplay(title, [this](const zen::EditorLink& link, CurveDisplay&) { Read(link); }, parent),
      m_rate(rate),
      m_sync(sync),
      m_tempo(tempo),
      m_shape(shape) {
    Plot().SetVertical(-1.0, 1.0, "");
}

LfoDisplay* LfoDisplay::Create(const ZenEditor& editor, const QString& title) {
    const int rate = editor.FindParameter("RATE"), sync = editor.FindParameter("SYNC");
    const int tempo = editor.FindParameter("TEMPO"), shape = editor.FindParameter("SHAPE");
    if (rate < 0 || sync < 0 || tempo < 0 || shape < 0) return nullptr;
    return new LfoDisplay(title, static_cast<std::uint32_t>(rate), static_cast<std::uint32_t>(sync),
                          static_cast<std::uint32_t>(tempo), static_cast<std::uint32_t>(shape));
}

void LfoDisplay::Read(const zen::EditorLink& link) {
    const float values[4] = {link.GetParameter(m_rate), link.GetParameter(m_sync), link.GetParameter(m_tempo),
                             link.GetParameter(m_shape)};
    if (std::equal(values, values + 4, m_values)) return;
    std::copy(values, values + 4, m_values);

    LfoRate rate;
    rate.SetHertz(values[0]);
    rate.SetSync(values[1]);
    rate.SetTempo(values[2]);
    m_hertz = rate.Hertz();
    if (!(m_hertz > 0.0)) return;

    const double seconds = kCycles / m_hertz;
    Plot().SetHorizontal(0.0, seconds, PlotArea::Scale::Linear, "s");
    Lfo lfo;
    lfo.SetSampleRate(kCurvePoints / seconds);
    lfo.SetShape(static_cast<Lfo::Shape>(std::lround(values[3])));
    lfo.SetRate(m_hertz);
    lfo.Reset();
    std::vector<QPointF> points;
    points.reserve(kCurvePoints + 1);
    for (int i = 0; i <= kCurvePoints; ++i) points.emplace_back(i * seconds / kCurvePoints, lfo.Next());
    SetCurve(0, std::move(points), QString("%1 Hz").arg(m_hertz, 0, 'g', 3));
}
