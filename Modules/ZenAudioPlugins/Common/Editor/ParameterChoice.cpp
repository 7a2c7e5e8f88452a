#include "ParameterChoice.h"

#include <QComboBox>
#include <QLabel>
#include <QSignalBlocker>
#include <QVBoxLayout>
#include <cmath>

ParameterChoice::ParameterChoice(zen::EditorLink& link, std::uint32_t index, QWidget* parent)
    : ParameterControl(link, index, parent), m_box(new QComboBox(this)) {
    auto* layout = new QVBoxLayout(this);
    layout->setContentsMargins(0, 0, 0, 0);
    m_label = new QLabel(m_caption, this);
    m_label->setAlignment(Qt::AlignHCenter);
    layout->addStretch();
    layout->addWidget(m_label);
    layout->addWidget(m_box);
    layout->addStretch();
    for (const float value : ListValues(m_info)) m_box->addItem(ValueText(value), value);
    connect(m_box, QOverload<int>::of(&QComboBox::activated), this,
            [this](int item) { SetValueFromUser(m_box->itemData(item).toFloat()); });
}

void ParameterChoice::SetCaption(const QString& caption) {
    ParameterControl::SetCaption(caption);
    m_label->setText(caption);
}

void ParameterChoice::ShowValue(float value) {
    const QSignalBlocker blocker(m_box);
    int nearest = 0;
    for (int i = 1; i < m_box->count(); ++i)
        if (std::fabs(m_box->itemData(i).toFloat() - value) < std::fabs(m_box->itemData(nearest).toFloat() - value))
            nearest = i;
    m_box->setCurrentIndex(nearest);
}
