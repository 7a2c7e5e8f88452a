#include "ReadoutDisplay.h"

#include <QPainter>
#include <algorithm>
#include <cmath>

ReadoutDisplay::ReadoutDisplay(const QString& caption, Update update, QWidget* parent)
    : EditorDisplay(parent), m_caption(caption), m_update(std::move(update)), m_text("–"), m_widest("+00.00 dB") {
    setSizePolicy(QSizePolicy::Preferred, QSizePolicy::Fixed);
}

ReadoutDisplay* ReadoutDisplay::ForMeter(const QString& caption, std::uint32_t meter, int decimals, QWidget* parent) {
    return new ReadoutDisplay(
        caption,
        [meter, decimals](const zen::EditorLink& link) {
            zen::MeterInfo info;
            link.GetMeterInfo(meter, info);
            double reading = link.GetMeter(meter);
            if (std::fabs(reading) < 0.5 * std::pow(10.0, -decimals)) reading = 0.0;  // no "-0.00"
            const QString value = QString::number(reading, 'f', decimals);
            return info.unit.empty() ? value : value + " " + QString::fromStdString(info.unit);
        },
        parent);
}

ReadoutDisplay* ReadoutDisplay::ForState(const QString& caption, std::uint32_t meter, const QString& off,
                                         const QString& on, QWidget* parent) {
    return new ReadoutDisplay(
        caption, [meter, off, on](const zen::EditorLink& link) { return link.GetMeter(meter) > 0.5f ? on : off; },
        parent);
}

QFont ReadoutDisplay::ValueFont() const {
    QFont large = font();
    large.setPointSizeF(large.pointSizeF() * kValueScale);
    large.setBold(true);
    return large;
}

void ReadoutDisplay::Refresh(const zen::EditorLink& link) {
    QString text = m_update(link);
    if (text == m_text) return;
    m_text = std::move(text);
    const QFontMetrics large(ValueFont());
    if (large.horizontalAdvance(m_text) > large.horizontalAdvance(m_widest)) {
        m_widest = m_text;
        updateGeometry();
    }
    update();
}

QSize ReadoutDisplay::sizeHint() const {
    const QFontMetrics small = fontMetrics();
    const QFontMetrics large(ValueFont());
    const int width = std::max(small.horizontalAdvance(m_caption), large.horizontalAdvance(m_widest));
    return {width + 2 * small.height(), small.height() + large.height() + small.height()};
}

void ReadoutDisplay::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    const QPalette& colours = palette();
    const int line = fontMetrics().height();
    painter.setPen(colours.color(QPalette::Mid));
    painter.drawRoundedRect(QRectF(rect()).adjusted(0.5, 0.5, -0.5, -0.5), line / 3.0, line / 3.0);
    painter.setPen(colours.color(QPalette::WindowText));
    painter.drawText(QRect(0, line / 4, width(), line), Qt::AlignHCenter | Qt::AlignTop, m_caption);
    painter.setFont(ValueFont());
    painter.setPen(colours.color(QPalette::BrightText));
    painter.drawText(QRect(0, line, width(), height() - line), Qt::AlignCenter, m_text);
}
