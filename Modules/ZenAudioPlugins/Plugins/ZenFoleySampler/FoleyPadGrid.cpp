#include "FoleyPadGrid.h"

#include <QGridLayout>
#include <QLabel>
#include <QPushButton>
#include <QVBoxLayout>
#include <algorithm>
#include <cmath>

#include "FoleyBank.h"

FoleyPadGrid::FoleyPadGrid(zen::EditorLink& link, std::uint32_t pad, std::uint32_t trigger, std::uint32_t pads,
                           std::uint32_t voices, QWidget* parent)
    : EditorDisplay(parent),
      m_link(link),
      m_pad(pad),
      m_trigger(trigger),
      m_padsMeter(pads),
      m_voicesMeter(voices),
      m_builtInPads(FoleyBank().BuiltInCount()) {
    auto* column = new QVBoxLayout(this);
    m_grid = new QGridLayout;
    column->addLayout(m_grid);
    m_statusLabel = new QLabel(this);
    m_statusLabel->setAlignment(Qt::AlignCenter);
    column->addWidget(m_statusLabel);
    column->addStretch(1);
}

void FoleyPadGrid::ShowPads(std::uint32_t count) {
    count = std::min(count, kShownPads);
    if (count == m_buttons.size()) return;
    for (QPushButton* button : m_buttons) delete button;
    m_buttons.clear();
    for (std::uint32_t i = 0; i < count; ++i) {
        auto* button = new QPushButton(QString::number(i + 1), this);
        button->setCheckable(true);
        button->setMinimumWidth(button->fontMetrics().horizontalAdvance("000") * 2);
        button->setMinimumHeight(button->fontMetrics().height() * 2);
        const std::uint32_t number = i + 1;
        connect(button, &QPushButton::pressed, this, [this, number] { Press(number); });
        connect(button, &QPushButton::released, this, [this] { Release(); });
        m_grid->addWidget(button, static_cast<int>(i / kColumns), static_cast<int>(i % kColumns));
        m_buttons.push_back(button);
    }
}

void FoleyPadGrid::Press(std::uint32_t number) {
    m_link.BeginEdit(m_pad);
    m_link.SetParameter(m_pad, static_cast<float>(number));
    m_link.EndEdit(m_pad);
    m_link.BeginEdit(m_trigger);
    m_link.SetParameter(m_trigger, 1.0f);
    m_lastPlayed = number;
}

void FoleyPadGrid::Release() {
    m_link.SetParameter(m_trigger, 0.0f);
    m_link.EndEdit(m_trigger);
}

void FoleyPadGrid::Refresh(const zen::EditorLink& link) {
    auto pads = static_cast<std::uint32_t>(std::lround(std::max(0.0f, link.GetMeter(m_padsMeter))));
    // Before the first block the bank has not been counted: the built-in pads are there.
    if (pads == 0) pads = m_builtInPads;
    ShowPads(pads);
    const auto selected = static_cast<std::uint32_t>(std::lround(link.GetParameter(m_pad)));
    for (std::uint32_t i = 0; i < m_buttons.size(); ++i) {
        QPushButton* button = m_buttons[i];
        const bool chosen = i + 1 == selected;
        if (button->isChecked() == chosen) continue;
        button->setChecked(chosen);
        // The chosen pad in the highlight colour, so it reads at a glance.
        QPalette colours = palette();
        if (chosen) colours.setColor(QPalette::Button, colours.color(QPalette::Highlight));
        button->setPalette(colours);
    }

    const int voices = static_cast<int>(std::lround(link.GetMeter(m_voicesMeter)));
    QString status = m_lastPlayed > 0 ? tr("Last played: pad %1").arg(m_lastPlayed) : tr("Press a pad to play it");
    status += "   ·   " + (voices == 1 ? tr("1 voice sounding") : tr("%1 voices sounding").arg(voices));
    if (status != m_status) {
        m_status = status;
        m_statusLabel->setText(m_status);
    }
}
