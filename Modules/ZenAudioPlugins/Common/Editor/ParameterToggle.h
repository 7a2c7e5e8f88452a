// A switch parameter as a lit button carrying the parameter's label.
#pragma once

#include "ParameterControl.h"

class QPushButton;

class ParameterToggle : public ParameterControl {
    Q_OBJECT

public:
    ParameterToggle(zen::EditorLink& link, std::uint32_t index, QWidget* parent = nullptr);

    void SetCaption(const QString& caption) override;

protected:
    void ShowValue(float value) override;

private:
    QPushButton* m_button;
};
