#include "GoniometerDisplay.h"

#include <QPainter>
#include <QPolygonF>
#include <algorithm>
#include <cmath>

namespace {

const QColor kTrace(110, 200, 255);
const QColor kPositive(90, 200, 120);
const QColor kNegative(230, 90, 80);

}  // namespace

GoniometerDisplay::GoniometerDisplay(const QString& title, std::uint32_t ring, int correlation, QWidget* parent)
    : TitledDisplay(title, {16, 18}, {12, 14}, parent), m_ring(ring), m_correlationMeter(correlation) {
    m_buffer.resize(2 * kReadChunk);
}

void GoniometerDisplay::Refresh(const zen::EditorLink& link) {
    zen::MeterInfo info;
    bool changed = false;
    if (link.GetMeterInfo(m_ring, info) && info.kind == zen::MeterKind::Ring && info.size >= 2) {
        if (m_buffer.size() < std::size_t{info.size} * kReadChunk) m_buffer.resize(std::size_t{info.size} * kReadChunk);
        for (;;) {
            const zen::MeterRingRead read = link.ReadMeterRing(m_ring, m_cursor, m_buffer.data(), kReadChunk);
            for (std::uint32_t r = 0; r < read.records; ++r) {
                const float* record = m_buffer.data() + std::size_t{r} * info.size;
                m_points.emplace_back(record[0], record[1]);
            }
            changed |= read.records > 0;
            if (read.records < kReadChunk) break;
        }
        // Without new points (transport stopped) the cloud empties over a few refreshes.
        std::size_t keep = kShownPoints;
        if (!changed) keep = m_points.size() > kShownPoints / kEmptyingRefreshes ? m_points.size() - kShownPoints / kEmptyingRefreshes : 0;
        changed |= m_points.size() > keep;
        while (m_points.size() > keep) m_points.pop_front();
    }
    if (m_correlationMeter >= 0) {
        const float correlation = std::clamp(link.GetMeter(static_cast<std::uint32_t>(m_correlationMeter)), -1.0f, 1.0f);
        changed |= correlation != m_correlation;
        m_correlation = correlation;
    }
    if (changed) update();
}

void GoniometerDisplay::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    const double line = PaintTitle(painter);
    const QPalette& colours = palette();

    const double barHeight = m_correlationMeter >= 0 ? 2.5 * line : 0.0;
    const QRectF area(line, 2.5 * line, width() - 2 * line, height() - 3 * line - barHeight);
    const double radius = std::max(1.0, std::min(area.width(), area.height()) / 2.0);
    const QPointF centre = area.center();

    // The L and R axes on the diagonals, M up, S across.
    QPen grid(colours.color(QPalette::Mid));
    grid.setWidthF(1.0);
    painter.setPen(grid);
    painter.drawEllipse(centre, radius, radius);
    const double diagonal = radius * std::sqrt(0.5);
    painter.drawLine(centre + QPointF(-diagonal, -diagonal), centre + QPointF(diagonal, diagonal));
    painter.drawLine(centre + QPointF(diagonal, -diagonal), centre + QPointF(-diagonal, diagonal));
    painter.drawLine(centre + QPointF(0, -radius), centre + QPointF(0, radius));
    painter.drawLine(centre + QPointF(-radius, 0), centre + QPointF(radius, 0));
    painter.setPen(colours.color(QPalette::WindowText));
    const QSizeF label(line, line);
    painter.drawText(QRectF(centre + QPointF(-diagonal - line, -diagonal - line), label), Qt::AlignCenter, "L");
    painter.drawText(QRectF(centre + QPointF(diagonal, -diagonal - line), label), Qt::AlignCenter, "R");
    painter.drawText(QRectF(centre + QPointF(-line / 2, -radius - line), label), Qt::AlignCenter, "M");

    // Full scale on one channel reaches the circle's diagonal. Older points
    // fade in a few steps, each drawn in one call.
    const double dot = std::max(1.5, line / 4.0);
    const std::size_t count = m_points.size();
    QPolygonF slice;
    for (std::size_t step = 0; step < kFadeSteps; ++step) {
        const std::size_t from = count * step / kFadeSteps, to = count * (step + 1) / kFadeSteps;
        slice.clear();
        for (std::size_t i = from; i < to; ++i) {
            const QPointF& p = m_points[i];
            if (p.x() * p.x() + p.y() * p.y() <= 1.0) slice << centre + QPointF(p.x() * radius, -p.y() * radius);
        }
        QColor colour = kTrace;
        colour.setAlphaF(0.15 + 0.85 * static_cast<double>(step + 1) / kFadeSteps);
        painter.setPen(QPen(colour, dot, Qt::SolidLine, Qt::RoundCap));
        painter.drawPoints(slice);
    }

    if (m_correlationMeter < 0) return;
    const QRectF bar(area.left(), area.bottom() + line, area.width(), line);
    painter.setBrush(colours.color(QPalette::Base));
    painter.setPen(grid);
    painter.drawRect(bar);
    const double zero = bar.center().x();
    const double at = zero + m_correlation * bar.width() / 2.0;
    painter.setPen(Qt::NoPen);
    painter.setBrush(m_correlation < 0.0f ? kNegative : kPositive);
    painter.drawRect(QRectF(QPointF(std::min(zero, at), bar.top()), QPointF(std::max(zero, at), bar.bottom())));
    painter.setPen(colours.color(QPalette::WindowText));
    painter.drawText(QRectF(bar.left(), bar.top(), bar.width() / 2, line), Qt::AlignLeft | Qt::AlignVCenter, " -1");
    painter.drawText(QRectF(bar.center().x(), bar.top(), bar.width() / 2, line), Qt::AlignRight | Qt::AlignVCenter,
                     QString("%1  +1 ").arg(static_cast<double>(m_correlation), 0, 'f', 2));
}
