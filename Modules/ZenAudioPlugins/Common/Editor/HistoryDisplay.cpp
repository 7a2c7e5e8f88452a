#include "HistoryDisplay.h"

#include <QPainter>
#include <algorithm>
#include <array>
#include <cmath>

#include "ZenEditor.h"

namespace {

const std::array<QColor, 4> kTraceColours = {QColor(0xe3, 0xa4, 0x4b), QColor(0x4f, 0xa3, 0xd9),
                                             QColor(0x7c, 0xc4, 0x7a), QColor(0xd0, 0x6f, 0x8f)};

}  // namespace

HistoryDisplay::HistoryDisplay(const QString& title, double minimum, double maximum, const QString& unit,
                               double seconds, Update update, QWidget* parent)
    : EditorDisplay(parent),
      m_title(title),
      m_update(std::move(update)),
      m_capacity(static_cast<std::size_t>(std::max(2.0, std::ceil(seconds * ZenEditor::kDisplayRate)))) {
    m_plot.SetHorizontal(-seconds, 0.0, PlotArea::Scale::Linear, QStringLiteral("s"));
    m_plot.SetVertical(minimum, maximum, unit);
    setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Expanding);
}

void HistoryDisplay::SetTraceNames(const std::vector<QString>& names) { m_names = names; }

void HistoryDisplay::Refresh(const zen::EditorLink& link) {
    if (!m_update) return;
    const std::vector<float> values = m_update(link);
    if (m_traces.size() < values.size()) m_traces.resize(values.size());
    for (std::size_t i = 0; i < values.size(); ++i) {
        std::vector<float>& trace = m_traces[i];
        if (trace.size() >= m_capacity) trace.erase(trace.begin(), trace.begin() + static_cast<long>(trace.size() - m_capacity + 1));
        trace.push_back(values[i]);
    }
    update();
}

QSize HistoryDisplay::sizeHint() const {
    const QFontMetrics metrics(font());
    return {metrics.averageCharWidth() * 50, metrics.height() * 12};
}

void HistoryDisplay::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    const QFontMetricsF metrics(font());
    const double line = m_plot.DrawTitled(painter, *this, m_title);

    painter.setRenderHint(QPainter::Antialiasing);
    double legendX = m_plot.Plot().right() - line * 0.4;
    for (std::size_t t = 0; t < m_traces.size(); ++t) {
        const std::vector<float>& trace = m_traces[t];
        const QColor colour = kTraceColours[t % kTraceColours.size()];
        std::vector<QPointF> points;
        points.reserve(trace.size());
        for (std::size_t i = 0; i < trace.size(); ++i) {
            const double age = static_cast<double>(trace.size() - 1 - i) / ZenEditor::kDisplayRate;
            points.emplace_back(-age, trace[i]);
        }
        painter.setPen(QPen(colour, std::max(1.5, line * 0.12)));
        m_plot.DrawCurve(painter, points);
        if (t < m_names.size() && !m_names[t].isEmpty()) {
            const double w = metrics.horizontalAdvance(m_names[t]);
            painter.drawText(QRectF(legendX - w, m_plot.Plot().top() + line * 0.2, w, line), Qt::AlignRight, m_names[t]);
            legendX -= w + line;
        }
    }
}
