#include "RoomView.h"

#include <QPainter>
#include <algorithm>
#include <cmath>

#include "Common/Reverb/zn_reverb.h"

using zen::reverb::zn_reverb;

namespace {

constexpr double kPi = 3.141592653589793;

const QColor kFloor(60, 66, 76);
const QColor kListener(110, 200, 255);
const QColor kSource(250, 190, 80);

}  // namespace

RoomView::RoomView(const QString& title, std::uint32_t length, std::uint32_t width, std::uint32_t height,
                   std::uint32_t distance, QWidget* parent)
    : TitledDisplay(title, {16, 18}, {12, 12}, parent),
      m_lengthIndex(length),
      m_widthIndex(width),
      m_heightIndex(height),
      m_distanceIndex(distance) {}

QPointF RoomView::SourcePosition(float length, float width, float distance) {
    // No parameter moves the source's direction: it stays where the engine's
    // record puts it (in half turns).
    static const zn_reverb defaults(48000.0f, 1, 1);
    const double d = std::max(distance, zn_reverb::kMinDistance);
    const double a = defaults.Get(zn_reverb::kSourceAzimuth) * kPi;
    const double e = defaults.Get(zn_reverb::kSourceElevation) * kPi;
    const double x = std::cos(a) * d * std::cos(e), y = std::sin(a) * d * std::cos(e);
    const double box = zn_reverb::kSourceBox;
    return {std::clamp(x, -box * length, box * length), std::clamp(y, -box * width, box * width)};
}

void RoomView::Refresh(const zen::EditorLink& link) {
    const float length = link.GetParameter(m_lengthIndex), width = link.GetParameter(m_widthIndex);
    const float height = link.GetParameter(m_heightIndex), distance = link.GetParameter(m_distanceIndex);
    if (length == m_length && width == m_width && height == m_height && distance == m_distance) return;
    m_length = length;
    m_width = width;
    m_height = height;
    m_distance = distance;
    update();
}

void RoomView::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    const double line = PaintTitle(painter);
    const QPalette& colours = palette();
    const QString size = QString("%1 × %2 × %3 m")
                             .arg(static_cast<double>(m_length), 0, 'f', 1)
                             .arg(static_cast<double>(m_width), 0, 'f', 1)
                             .arg(static_cast<double>(m_height), 0, 'f', 1);
    painter.drawText(QRectF(0, height() - 1.5 * line, width(), line), Qt::AlignHCenter | Qt::AlignVCenter, size);
    if (m_length <= 0.0f || m_width <= 0.0f) return;

    const QRectF area(line, 2.0 * line, width() - 2.0 * line, height() - 4.0 * line);
    const double scale = std::min(area.width() / m_length, area.height() / m_width);
    const QPointF centre = area.center();
    const QRectF floor(centre.x() - m_length * scale / 2.0, centre.y() - m_width * scale / 2.0, m_length * scale,
                       m_width * scale);
    painter.setPen(QPen(colours.color(QPalette::Mid), 1.5));
    painter.setBrush(kFloor);
    painter.drawRect(floor);

    const double dot = line / 3.0;
    const QPointF source = Source();
    const QPointF sourcePixel = centre + QPointF(source.x() * scale, -source.y() * scale);
    painter.setPen(QPen(colours.color(QPalette::Mid), 1.0, Qt::DashLine));
    painter.drawLine(centre, sourcePixel);
    painter.setPen(Qt::NoPen);
    painter.setBrush(kListener);
    painter.drawEllipse(centre, dot, dot);
    painter.setBrush(kSource);
    painter.drawEllipse(sourcePixel, dot, dot);
    painter.setPen(colours.color(QPalette::WindowText));
    painter.drawText(QRectF(sourcePixel.x() + dot, sourcePixel.y() - line, 6 * line, line),
                     Qt::AlignLeft | Qt::AlignVCenter, tr("Source"));
    painter.drawText(QRectF(centre.x() + dot, centre.y(), 6 * line, line), Qt::AlignLeft | Qt::AlignVCenter,
                     tr("Listener"));
}
