#include "TitledDisplay.h"

TitledDisplay::TitledDisplay(const QString& title, QSize lines, QSize minimumLines, QWidget* parent)
    : EditorDisplay(parent), m_title(title), m_lines(lines), m_minimumLines(minimumLines) {
    setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Expanding);
}

double TitledDisplay::PaintTitle(QPainter& painter) const {
    painter.setRenderHint(QPainter::Antialiasing);
    const double line = QFontMetricsF(font()).height();
    painter.setPen(palette().color(QPalette::WindowText));
    painter.drawText(QRectF(0, 0, width(), line), Qt::AlignHCenter | Qt::AlignTop, m_title);
    return line;
}

QSize TitledDisplay::sizeHint() const { return m_lines * fontMetrics().height(); }

QSize TitledDisplay::minimumSizeHint() const { return m_minimumLines * fontMetrics().height(); }
