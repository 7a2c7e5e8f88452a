// A list parameter as a labelled choice of its captions.
#pragma once

#include "ParameterControl.h"

class QComboBox;
class QLabel;

class ParameterChoice : public ParameterControl {
    Q_OBJECT

public:
    ParameterChoice(zen::EditorLink& link, std::uint32_t index, QWidget* parent = nullptr);

    void SetCaption(const QString& caption) override;

protected:
    void ShowValue(float value) override;

private:
    QComboBox* m_box;
    QLabel* m_label = nullptr;
};
