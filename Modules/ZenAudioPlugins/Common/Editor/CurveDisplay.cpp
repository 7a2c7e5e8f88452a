#include "CurveDisplay.h"

#include <QPainter>
#include <QPainterPath>
#include <algorithm>
#include <array>

namespace {

// Curves in the order a layout adds them: the main response first.
const std::array<QColor, 5> kCurveColours = {QColor(0x4f, 0xa3, 0xd9), QColor(0xe3, 0xa4, 0x4b),
                                             QColor(0x7c, 0xc4, 0x7a), QColor(0xd0, 0x6f, 0x8f),
                                             QColor(0xa8, 0x93, 0xe0)};

}  // namespace

CurveDisplay::CurveDisplay(const QString& title, Update update, QWidget* parent)
    : EditorDisplay(parent), m_title(title), m_update(std::move(update)) {
    setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Expanding);
}

void CurveDisplay::SetCurve(std::size_t index, std::vector<QPointF> points, const QString& name, bool filled) {
    if (m_curves.size() <= index) m_curves.resize(index + 1);
    Curve& curve = m_curves[index];
    curve.points = std::move(points);
    curve.name = name;
    curve.filled = filled;
}

void CurveDisplay::SetMarker(std::optional<QPointF> point) { m_marker = point; }

void CurveDisplay::Refresh(const zen::EditorLink& link) {
    if (!m_update) return;
    // Most refreshes find the settings unchanged: no repaint then.
    const std::vector<Curve> before = m_curves;
    const std::optional<QPointF> marker = m_marker;
    m_update(link, *this);
    const auto same = [](const Curve& a, const Curve& b) {
        return a.points == b.points && a.name == b.name && a.filled == b.filled;
    };
    if (marker != m_marker || !std::equal(before.begin(), before.end(), m_curves.begin(), m_curves.end(), same))
        update();
}

QSize CurveDisplay::sizeHint() const {
    const QFontMetrics metrics(font());
    return {metrics.averageCharWidth() * 60, metrics.height() * 14};
}

void CurveDisplay::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    const QFontMetricsF metrics(font());
    const double line = m_plot.DrawTitled(painter, *this, m_title);

    painter.setRenderHint(QPainter::Antialiasing);
    const double lineWidth = std::max(1.5, line * 0.12);
    double legendX = m_plot.Plot().right() - line * 0.4;
    for (std::size_t i = 0; i < m_curves.size(); ++i) {
        const Curve& curve = m_curves[i];
        const QColor colour = kCurveColours[i % kCurveColours.size()];
        if (curve.filled && curve.points.size() >= 2) {
            QPainterPath area;
            area.moveTo(m_plot.ToPixel(curve.points.front().x(), m_plot.MinimumY()));
            for (const QPointF& p : curve.points)
                area.lineTo(m_plot.ToPixel(p.x(), std::clamp(p.y(), m_plot.MinimumY(), m_plot.MaximumY())));
            area.lineTo(m_plot.ToPixel(curve.points.back().x(), m_plot.MinimumY()));
            QColor fill = colour;
            fill.setAlpha(70);
            painter.save();
            painter.setClipRect(m_plot.Plot());
            painter.fillPath(area, fill);
            painter.restore();
        }
        painter.setPen(QPen(colour, lineWidth));
        m_plot.DrawCurve(painter, curve.points);
        // Names of several curves, right-aligned along the top of the plot.
        if (!curve.name.isEmpty() && m_curves.size() > 1) {
            const double w = metrics.horizontalAdvance(curve.name);
            painter.drawText(QRectF(legendX - w, m_plot.Plot().top() + line * 0.2, w, line), Qt::AlignRight, curve.name);
            legendX -= w + line;
        }
    }
    if (m_marker) {
        const QPointF p = m_plot.ToPixel(m_marker->x(), m_marker->y());
        if (m_plot.Plot().adjusted(-1, -1, 1, 1).contains(p)) {
            painter.setPen(QPen(palette().color(QPalette::Window), lineWidth));
            painter.setBrush(palette().color(QPalette::BrightText));
            painter.drawEllipse(p, line * 0.3, line * 0.3);
        }
    }
}
