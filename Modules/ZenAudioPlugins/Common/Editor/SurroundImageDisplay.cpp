#include "SurroundImageDisplay.h"

#include <QPainter>
#include <QPainterPath>
#include <algorithm>
#include <cmath>

#include "Common/Algorithms/SpeakerLayout.h"

namespace {

constexpr double kPi = 3.141592653589793;
constexpr float kQuietDb = -60.0f;  // a loudspeaker this quiet shows dark

const QColor kImage(110, 200, 255);
const QColor kSpeaker(250, 190, 80);

}  // namespace

SurroundImageDisplay::SurroundImageDisplay(const QString& title, std::uint32_t direction, std::uint32_t spread,
                                           std::vector<std::uint32_t> levels, QWidget* parent)
    : TitledDisplay(title, {16, 16}, {12, 12}, parent),
      m_directionMeter(direction),
      m_spreadMeter(spread),
      m_levelMeters(std::move(levels)) {}

void SurroundImageDisplay::Refresh(const zen::EditorLink& link) {
    const std::size_t channels = std::min<std::size_t>(link.GetInputChannelCount(), m_levelMeters.size());
    std::vector<float> levels(channels);
    for (std::size_t c = 0; c < channels; ++c) levels[c] = link.GetMeter(m_levelMeters[c]);
    const float direction = link.GetMeter(m_directionMeter), spread = link.GetMeter(m_spreadMeter);
    if (levels == m_levels && direction == m_direction && spread == m_spread) return;
    m_levels = std::move(levels);
    m_direction = direction;
    m_spread = spread;
    update();
}

void SurroundImageDisplay::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    const double line = PaintTitle(painter);
    const QPalette& colours = palette();

    const QRectF area(line, 2.0 * line, width() - 2.0 * line, height() - 3.0 * line);
    const double radius = std::max(1.0, std::min(area.width(), area.height()) / 2.0 - line);
    const QPointF centre = area.center();
    // Degrees clockwise from the front (up) to a point at `scale` of the radius.
    const auto at = [&](double degrees, double scale) {
        const double a = degrees * kPi / 180.0;
        return centre + QPointF(std::sin(a) * radius * scale, -std::cos(a) * radius * scale);
    };
    painter.setPen(QPen(colours.color(QPalette::Mid), 1.0));
    painter.setBrush(Qt::NoBrush);
    painter.drawEllipse(centre, radius, radius);

    // The spread as an arc around the direction (Qt's angles: counter-clockwise from 3 o'clock, in 1/16 degree).
    const double spread = std::clamp(static_cast<double>(m_spread), 0.0, 180.0);
    if (spread > 0.0) {
        QColor fill = kImage;
        fill.setAlphaF(0.25);
        painter.setPen(Qt::NoPen);
        painter.setBrush(fill);
        const QRectF box(centre.x() - radius * 0.8, centre.y() - radius * 0.8, radius * 1.6, radius * 1.6);
        const double start = 90.0 - m_direction - spread / 2.0;
        painter.drawPie(box, static_cast<int>(std::lround(start * 16.0)), static_cast<int>(std::lround(spread * 16.0)));
    }
    painter.setPen(QPen(kImage, std::max(1.5, line / 6.0)));
    painter.drawLine(centre, at(m_direction, 0.8));

    const auto channels = m_levels.size();
    const int lfe = zen::SpeakerLayout::DefaultLfe(channels);
    if (!zen::SpeakerLayout::HasAzimuths(channels)) return;
    const double dot = line / 2.5;
    for (std::size_t c = 0; c < channels; ++c) {
        if (static_cast<int>(c) == lfe) continue;
        const double loudness = std::clamp((m_levels[c] - kQuietDb) / -kQuietDb, 0.0f, 1.0f);
        QColor colour = kSpeaker;
        colour.setAlphaF(0.25 + 0.75 * loudness);
        painter.setPen(Qt::NoPen);
        painter.setBrush(colour);
        painter.drawEllipse(at(zen::SpeakerLayout::Azimuth(channels, c), 1.0), dot, dot);
    }
}
