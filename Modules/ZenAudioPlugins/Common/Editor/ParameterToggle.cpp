#include "ParameterToggle.h"

#include <QPushButton>
#include <QSignalBlocker>
#include <QVBoxLayout>

ParameterToggle::ParameterToggle(zen::EditorLink& link, std::uint32_t index, QWidget* parent)
    : ParameterControl(link, index, parent), m_button(new QPushButton(m_caption, this)) {
    auto* layout = new QVBoxLayout(this);
    layout->setContentsMargins(0, 0, 0, 0);
    m_button->setCheckable(true);
    layout->addStretch();
    layout->addWidget(m_button);
    layout->addStretch();
    connect(m_button, &QPushButton::toggled, this, [this](bool on) { SetValueFromUser(on ? 1.0f : 0.0f); });
}

void ParameterToggle::SetCaption(const QString& caption) {
    ParameterControl::SetCaption(caption);
    m_button->setText(caption);
}

void ParameterToggle::ShowValue(float value) {
    const QSignalBlocker blocker(m_button);
    m_button->setChecked(value >= 0.5f);
}
