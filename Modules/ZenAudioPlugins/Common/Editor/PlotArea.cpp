#include "PlotArea.h"

#include <QFontMetricsF>
#include <QWidget>
#include <algorithm>
#include <cmath>

namespace {

const QString kMinus = QStringLiteral("\u2212");

// Steps of 1, 2 or 5 times a power of ten giving at most `ticks` intervals.
double NiceStep(double range, int ticks) {
    const double raw = range / ticks;
    const double decade = std::pow(10.0, std::floor(std::log10(raw)));
    for (const double m : {1.0, 2.0, 5.0, 10.0})
        if (m * decade >= raw) return m * decade;
    return 10.0 * decade;
}

QString Label(double value, double step) {
    const int decimals = step >= 1.0 ? 0 : std::min(3, static_cast<int>(std::ceil(-std::log10(step) - 1e-9)));
    QString text = QString::number(value, 'f', decimals);
    if (text.startsWith('-')) text.replace(0, 1, kMinus);
    return text;
}

QString FrequencyLabel(double hz) {
    if (hz >= 1000.0) return QString::number(hz / 1000.0, 'g', 3) + 'k';
    return QString::number(hz, 'g', 3);
}

}  // namespace

void PlotArea::SetHorizontal(double minimum, double maximum, Scale scale, const QString& unit) {
    m_xMin = minimum;
    m_xMax = maximum > minimum ? maximum : minimum + 1.0;
    m_xScale = scale == Scale::Logarithmic && minimum > 0.0 ? Scale::Logarithmic : Scale::Linear;
    m_xUnit = unit;
}

void PlotArea::SetVertical(double minimum, double maximum, const QString& unit) {
    m_yMin = minimum;
    m_yMax = maximum > minimum ? maximum : minimum + 1.0;
    m_yUnit = unit;
}

std::vector<double> PlotArea::HorizontalTicks() const {
    std::vector<double> ticks;
    if (m_xScale == Scale::Logarithmic) {
        // 1, 2, 5 in every decade: 20, 50, 100, 200, 500, 1k ...
        for (double decade = std::pow(10.0, std::floor(std::log10(m_xMin))); decade <= m_xMax; decade *= 10.0)
            for (const double m : {1.0, 2.0, 5.0})
                if (m * decade >= m_xMin * 0.999 && m * decade <= m_xMax * 1.001) ticks.push_back(m * decade);
        return ticks;
    }
    const double step = NiceStep(m_xMax - m_xMin, 8);
    for (double x = std::ceil(m_xMin / step - 1e-9) * step; x <= m_xMax + step * 1e-9; x += step) ticks.push_back(x);
    return ticks;
}

double PlotArea::VerticalStep() const {
    const double range = m_yMax - m_yMin;
    if (m_yUnit.startsWith(QStringLiteral("dB")) || m_yUnit == QStringLiteral("LUFS") ||
        m_yUnit == QStringLiteral("LU")) {
        // Levels read best on a grid of 6 dB, or 12 and 24 over wide ranges.
        if (range <= 48.0) return range <= 12.0 ? 3.0 : 6.0;
        return range <= 96.0 ? 12.0 : 24.0;
    }
    return NiceStep(range, 6);
}

QString PlotArea::HorizontalLabel(double x) const {
    if (m_xUnit == QStringLiteral("Hz")) return FrequencyLabel(x);
    return Label(x, m_xScale == Scale::Logarithmic ? x : NiceStep(m_xMax - m_xMin, 8));
}

void PlotArea::Layout(const QFontMetricsF& metrics, const QRectF& bounds) {
    const double step = VerticalStep();
    double labelWidth = 0.0;
    for (double y = std::ceil(m_yMin / step - 1e-9) * step; y <= m_yMax + 1e-9; y += step)
        labelWidth = std::max(labelWidth, metrics.horizontalAdvance(Label(y, step)));
    const double pad = metrics.height() * 0.4;
    const double right = std::max(pad, metrics.horizontalAdvance(HorizontalLabel(m_xMax)) / 2.0);
    m_plot = QRectF(bounds.left() + labelWidth + pad * 2.0, bounds.top() + metrics.height() * 0.6,
                    0.0, 0.0);
    m_plot.setRight(bounds.right() - right);
    m_plot.setBottom(bounds.bottom() - metrics.height() - pad);
    if (m_plot.width() < 1.0) m_plot.setWidth(1.0);
    if (m_plot.height() < 1.0) m_plot.setHeight(1.0);
}

double PlotArea::ToPixelX(double x) const {
    double t;
    if (m_xScale == Scale::Logarithmic)
        t = std::log(std::max(x, 1e-30) / m_xMin) / std::log(m_xMax / m_xMin);
    else
        t = (x - m_xMin) / (m_xMax - m_xMin);
    return m_plot.left() + t * m_plot.width();
}

QPointF PlotArea::ToPixel(double x, double y) const {
    const double ty = (y - m_yMin) / (m_yMax - m_yMin);
    return {ToPixelX(x), m_plot.bottom() - ty * m_plot.height()};
}

double PlotArea::ToDataX(double pixelX) const {
    const double t = (pixelX - m_plot.left()) / m_plot.width();
    if (m_xScale == Scale::Logarithmic) return m_xMin * std::pow(m_xMax / m_xMin, t);
    return m_xMin + t * (m_xMax - m_xMin);
}

double PlotArea::DrawTitled(QPainter& painter, const QWidget& widget, const QString& title) {
    constexpr double kTitleLines = 1.3;
    const double line = QFontMetricsF(widget.font()).height();
    const double width = widget.width();
    painter.fillRect(widget.rect(), widget.palette().color(QPalette::Window));
    painter.setPen(widget.palette().color(QPalette::WindowText));
    painter.drawText(QRectF(line * 0.3, 0, width - line * 0.6, line * kTitleLines), Qt::AlignLeft | Qt::AlignVCenter,
                     title);
    Draw(painter, QRectF(0, line * kTitleLines, width, widget.height() - line * kTitleLines));
    return line;
}

void PlotArea::Draw(QPainter& painter, const QRectF& bounds) {
    const QFontMetricsF metrics(painter.font());
    Layout(metrics, bounds);
    const auto* widget = dynamic_cast<const QWidget*>(painter.device());
    const QPalette palette = widget != nullptr ? widget->palette() : QPalette();
    const QColor grid = palette.color(QPalette::Mid);
    const QColor text = palette.color(QPalette::WindowText);

    painter.save();
    painter.setRenderHint(QPainter::Antialiasing, false);
    painter.fillRect(m_plot, palette.color(QPalette::Base));
    painter.setPen(QPen(grid, 0));

    const double line = metrics.height();
    for (const double x : HorizontalTicks()) {
        const double px = ToPixelX(x);
        painter.setPen(QPen(grid, 0));
        painter.drawLine(QPointF(px, m_plot.top()), QPointF(px, m_plot.bottom()));
        painter.setPen(text);
        const QString label = HorizontalLabel(x);
        const double w = metrics.horizontalAdvance(label);
        painter.drawText(QRectF(px - w / 2.0 - 2.0, m_plot.bottom() + line * 0.2, w + 4.0, line),
                         Qt::AlignHCenter | Qt::AlignTop, label);
    }
    const double step = VerticalStep();
    for (double y = std::ceil(m_yMin / step - 1e-9) * step; y <= m_yMax + 1e-9; y += step) {
        const double py = ToPixel(m_xMin, y).y();
        // The zero line (0 dB) stands out.
        painter.setPen(QPen(std::fabs(y) < step * 1e-6 ? grid.lighter(150) : grid, 0));
        painter.drawLine(QPointF(m_plot.left(), py), QPointF(m_plot.right(), py));
        painter.setPen(text);
        painter.drawText(QRectF(bounds.left(), py - line / 2.0, m_plot.left() - bounds.left() - line * 0.3, line),
                         Qt::AlignRight | Qt::AlignVCenter, Label(y, step));
    }
    // Units inside the frame's corners, clear of the labels and the legend
    // (top right); frequencies need none beside "1k".
    painter.setPen(palette.color(QPalette::PlaceholderText));
    const QRectF inside = m_plot.adjusted(line * 0.3, line * 0.15, -line * 0.3, -line * 0.15);
    painter.drawText(inside, Qt::AlignLeft | Qt::AlignTop, m_yUnit);
    if (m_xUnit != QStringLiteral("Hz")) painter.drawText(inside, Qt::AlignRight | Qt::AlignBottom, m_xUnit);
    painter.setPen(QPen(grid.lighter(130), 0));
    painter.setBrush(Qt::NoBrush);
    painter.drawRect(m_plot);
    painter.restore();
}

void PlotArea::DrawCurve(QPainter& painter, const std::vector<QPointF>& points) const {
    if (points.size() < 2) return;
    QPolygonF line;
    line.reserve(static_cast<int>(points.size()));
    for (const QPointF& p : points) {
        if (!std::isfinite(p.x()) || !std::isfinite(p.y())) continue;
        // Far-off values (-inf dB of a notch) stay just outside the frame.
        const double y = std::clamp(p.y(), m_yMin - (m_yMax - m_yMin), m_yMax + (m_yMax - m_yMin));
        line << ToPixel(p.x(), y);
    }
    painter.save();
    painter.setClipRect(m_plot);
    painter.drawPolyline(line);
    painter.restore();
}

std::vector<double> PlotArea::SamplePositions(int count) const {
    std::vector<double> positions;
    if (count <= 0) return positions;
    positions.reserve(static_cast<std::size_t>(count));
    for (int i = 0; i < count; ++i) {
        const double t = count > 1 ? static_cast<double>(i) / (count - 1) : 0.0;
        positions.push_back(m_xScale == Scale::Logarithmic ? m_xMin * std::pow(m_xMax / m_xMin, t)
                                                             : m_xMin + t * (m_xMax - m_xMin));
    }
    return positions;
}
