// A list parameter as a labelled choice of its captions.
#pragma once

#include "ParameterControl.h"

class QComboBox;

class ParameterChoice : public ParameterControl {
    Q_OBJECT

public:
    ParameterChoice(zen::EditorLink& link, std::uint32_t index, QWidget* parent = nullptr);

protected:
    void ShowValue(float value) override;

private:
    QComboBox* m_box;
};
