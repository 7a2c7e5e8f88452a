// The control of one parameter: a knob for a continuous value (vertical drag,
// Shift for fine steps, double-click for the default, click the value to type
// one with or without its unit), a toggle for a switch, a choice for a list.
// Positions follow the parameter's taper (linear, logarithmic, list) as the
// library maps them, so a control and a host's automation lane agree.
#pragma once

#include <QWidget>
#include <cstdint>
#include <vector>

#include "zen/EditorLink.h"

class ParameterControl : public QWidget {
    Q_OBJECT

public:
    // The right control for the parameter's kind.
    static ParameterControl* Create(zen::EditorLink& link, std::uint32_t index, QWidget* parent = nullptr);

    std::uint32_t Index() const { return m_index; }
    const zen::ParameterInfo& Info() const { return m_info; }
    // The name the control shows; the parameter's label unless its group
    // makes part of it redundant. The tooltip keeps the whole label.
    const QString& Caption() const { return m_caption; }
    virtual void SetCaption(const QString& caption);

    // What a user's gesture does: sets the parameter through the link (one
    // edit gesture) and shows the new value.
    void SetValueFromUser(float value);
    void SetPositionFromUser(float position);  // 0..1 along the taper
    // Parses typed text ("-6", "-6 dB", "2.5k", "Slow"); false leaves the
    // value as it was.
    bool EnterText(const QString& text);

    // Shows the link's present value; called at every refresh.
    virtual void SyncFromLink();

    float ShownValue() const { return m_shown; }
    QString ValueText(float value) const;  // "−6.0 dB", "2.50 kHz", "Slow"

    // The taper's mapping, shared with tests.
    static float ValueToPosition(const zen::ParameterInfo& info, float value);
    static float PositionToValue(const zen::ParameterInfo& info, float position);
    // The values a list or switch parameter takes, in order.
    static std::vector<float> ListValues(const zen::ParameterInfo& info);

signals:
    void ValueShown(float value);

protected:
    ParameterControl(zen::EditorLink& link, std::uint32_t index, QWidget* parent);

    // Sets the parameter inside a gesture the caller opened (a drag).
    void ApplyValue(float value);
    // Shows a value the link now holds; the control's own drawing.
    virtual void ShowValue(float value) = 0;

    zen::EditorLink& m_link;
    std::uint32_t m_index;
    zen::ParameterInfo m_info;
    float m_shown = 0.0f;
    QString m_caption;

private:
    bool m_synced = false;
};
