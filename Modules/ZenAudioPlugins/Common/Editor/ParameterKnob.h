// A knob for a continuous parameter: the label above, an arc that fills
// along the taper, the value below. Vertical drag moves it (Shift for fine
// steps), a double-click returns to the default, a click on the value opens
// typed entry (Enter applies, Esc cancels).
#pragma once

#include <QPointF>
#include <QRectF>

#include "ParameterControl.h"

class QLineEdit;

class ParameterKnob : public ParameterControl {
    Q_OBJECT

public:
    // A full sweep takes this many text lines of drag; Shift takes ten times more.
    static constexpr double kSweepLines = 12.0;
    static constexpr double kFineFactor = 0.1;

    ParameterKnob(zen::EditorLink& link, std::uint32_t index, QWidget* parent = nullptr);

    QSize sizeHint() const override;
    QSize minimumSizeHint() const override { return sizeHint(); }

    // Typed entry: opens the field over the value, as a click on it does.
    void OpenTextEntry();
    bool IsTextEntryOpen() const;

protected:
    void ShowValue(float value) override;
    void paintEvent(QPaintEvent* event) override;
    void mousePressEvent(QMouseEvent* event) override;
    void mouseMoveEvent(QMouseEvent* event) override;
    void mouseReleaseEvent(QMouseEvent* event) override;
    void mouseDoubleClickEvent(QMouseEvent* event) override;
    bool eventFilter(QObject* watched, QEvent* event) override;

private:
    QRectF KnobRect() const;
    QRectF ValueRect() const;
    void CloseTextEntry(bool apply);

    QLineEdit* m_entry = nullptr;
    bool m_dragging = false;
    QPointF m_dragLast;
    float m_dragPosition = 0.0f;
};
