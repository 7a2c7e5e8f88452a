#include "ParameterKnob.h"

#include <QKeyEvent>
#include <QLineEdit>
#include <QMouseEvent>
#include <QPainter>
#include <QPainterPath>
#include <algorithm>
#include <cmath>

namespace {

// The arc runs from lower left (225 degrees) clockwise to lower right.
constexpr double kStartAngle = 225.0;
constexpr double kSweepAngle = 270.0;
constexpr double kKnobLines = 2.6;  // diameter in text lines
constexpr double kDegrees = 3.14159265358979323846 / 180.0;

}  // namespace

ParameterKnob::ParameterKnob(zen::EditorLink& link, std::uint32_t index, QWidget* parent)
    : ParameterControl(link, index, parent) {
    setSizePolicy(QSizePolicy::Fixed, QSizePolicy::Fixed);
    setCursor(Qt::SizeVerCursor);
    m_entry = new QLineEdit(this);
    m_entry->setAlignment(Qt::AlignCenter);
    m_entry->setFrame(false);
    m_entry->hide();
    m_entry->installEventFilter(this);
    connect(m_entry, &QLineEdit::returnPressed, this, [this] { CloseTextEntry(true); });
}

QSize ParameterKnob::sizeHint() const {
    const QFontMetrics metrics(font());
    // Wide enough for the label and the widest values of the range.
    int width = metrics.horizontalAdvance(m_caption);
    for (const float v : {m_info.minimum, m_info.maximum, m_info.defaultValue, -88.8f})
        if (v >= m_info.minimum && v <= m_info.maximum)
            width = std::max(width, metrics.horizontalAdvance(ValueText(v)));
    width = std::max(width + metrics.averageCharWidth() * 2, static_cast<int>(metrics.height() * 4.5));
    const int height = static_cast<int>(metrics.height() * (2.0 + kKnobLines + 0.8));
    return {width, height};
}

QRectF ParameterKnob::KnobRect() const {
    const double line = QFontMetricsF(font()).height();
    const double diameter = line * kKnobLines;
    return {(width() - diameter) / 2.0, line * 1.2, diameter, diameter};
}

QRectF ParameterKnob::ValueRect() const {
    const double line = QFontMetricsF(font()).height();
    return {0.0, height() - line * 1.3, static_cast<double>(width()), line * 1.2};
}

void ParameterKnob::ShowValue(float) { update(); }

void ParameterKnob::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    painter.setRenderHint(QPainter::Antialiasing);
    const QPalette& colours = palette();
    const double line = QFontMetricsF(font()).height();

    painter.setPen(colours.color(QPalette::WindowText));
    painter.drawText(QRectF(0, 0, width(), line * 1.1), Qt::AlignHCenter | Qt::AlignVCenter,
                     m_caption);

    const QRectF knob = KnobRect();
    const double thickness = std::max(2.0, line * 0.22);
    const QRectF arc = knob.adjusted(thickness, thickness, -thickness, -thickness);
    const float position = std::clamp(ValueToPosition(m_info, m_shown), 0.0f, 1.0f);

    painter.setBrush(Qt::NoBrush);
    painter.setPen(QPen(colours.color(QPalette::Mid), thickness, Qt::SolidLine, Qt::RoundCap));
    painter.drawArc(arc, static_cast<int>(kStartAngle * 16), static_cast<int>(-kSweepAngle * 16));
    // Bipolar ranges fill from the centre value (0 dB), others from the start.
    double from = 0.0;
    if (m_info.taper == zen::ParameterTaper::Linear && m_info.minimum < 0.0f && m_info.maximum > 0.0f)
        from = std::clamp(ValueToPosition(m_info, 0.0f), 0.0f, 1.0f);
    painter.setPen(QPen(colours.color(QPalette::Highlight), thickness, Qt::SolidLine, Qt::RoundCap));
    painter.drawArc(arc, static_cast<int>((kStartAngle - from * kSweepAngle) * 16),
                    static_cast<int>(-(position - from) * kSweepAngle * 16));

    // Pointer from the centre towards the value.
    const double angle = (kStartAngle - position * kSweepAngle) * kDegrees;
    const QPointF centre = knob.center();
    const double radius = arc.width() / 2.0 - thickness;
    painter.setBrush(colours.color(QPalette::Button));
    painter.setPen(Qt::NoPen);
    painter.drawEllipse(centre, radius, radius);
    painter.setPen(QPen(colours.color(QPalette::ButtonText), std::max(1.5, thickness * 0.7), Qt::SolidLine,
                        Qt::RoundCap));
    painter.drawLine(centre + QPointF(std::cos(angle), -std::sin(angle)) * radius * 0.3,
                     centre + QPointF(std::cos(angle), -std::sin(angle)) * radius * 0.9);

    if (!IsTextEntryOpen()) {
        painter.setPen(colours.color(QPalette::Text));
        painter.drawText(ValueRect(), Qt::AlignCenter, ValueText(m_shown));
    }
}

void ParameterKnob::mousePressEvent(QMouseEvent* event) {
    if (event->button() != Qt::LeftButton) return QWidget::mousePressEvent(event);
    if (ValueRect().contains(event->pos())) {
        OpenTextEntry();
        return;
    }
    m_dragging = true;
    m_dragLast = event->pos();
    m_dragPosition = std::clamp(ValueToPosition(m_info, m_shown), 0.0f, 1.0f);
    m_link.BeginEdit(m_index);
}

void ParameterKnob::mouseMoveEvent(QMouseEvent* event) {
    if (!m_dragging) return;
    const double dy = m_dragLast.y() - event->pos().y();
    m_dragLast = event->pos();
    double step = dy / (QFontMetricsF(font()).height() * kSweepLines);
    if (event->modifiers() & Qt::ShiftModifier) step *= kFineFactor;
    // The drag keeps its own position, so a list or step quantisation of the
    // value does not swallow small moves.
    m_dragPosition = std::clamp(m_dragPosition + static_cast<float>(step), 0.0f, 1.0f);
    ApplyValue(PositionToValue(m_info, m_dragPosition));
}

void ParameterKnob::mouseReleaseEvent(QMouseEvent* event) {
    if (!m_dragging || event->button() != Qt::LeftButton) return;
    m_dragging = false;
    m_link.EndEdit(m_index);
}

void ParameterKnob::mouseDoubleClickEvent(QMouseEvent* event) {
    if (event->button() != Qt::LeftButton || ValueRect().contains(event->pos())) return;
    SetValueFromUser(m_info.defaultValue);
}

void ParameterKnob::OpenTextEntry() {
    m_entry->setGeometry(ValueRect().toRect());
    m_entry->setText(ValueText(m_shown));
    m_entry->selectAll();
    m_entry->show();
    m_entry->setFocus();
    update();
}

bool ParameterKnob::IsTextEntryOpen() const { return !m_entry->isHidden(); }

void ParameterKnob::CloseTextEntry(bool apply) {
    if (m_entry->isHidden()) return;
    const QString text = m_entry->text();
    m_entry->hide();
    if (apply) EnterText(text);
    update();
}

bool ParameterKnob::eventFilter(QObject* watched, QEvent* event) {
    if (watched == m_entry) {
        if (event->type() == QEvent::KeyPress && static_cast<QKeyEvent*>(event)->key() == Qt::Key_Escape) {
            CloseTextEntry(false);
            return true;
        }
        if (event->type() == QEvent::FocusOut) CloseTextEntry(false);
    }
    return ParameterControl::eventFilter(watched, event);
}
