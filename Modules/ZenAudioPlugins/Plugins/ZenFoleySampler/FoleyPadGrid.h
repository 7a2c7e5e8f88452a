// The pads of "Foley Sampler" as buttons: pressing one selects it ("Pad")
// and raises "Trigger", releasing it lowers "Trigger" again, so each press
// is one rising edge the audio thread sees. Beneath, the last pad played and
// the voices sounding.
#pragma once

#include <QString>
#include <cstdint>
#include <vector>

#include "Common/Editor/EditorDisplay.h"

class QGridLayout;
class QLabel;
class QPushButton;

class FoleyPadGrid : public EditorDisplay {
    Q_OBJECT

public:
    static constexpr std::uint32_t kColumns = 8;
    static constexpr std::uint32_t kShownPads = 32;  // further pads through the "Pad" control

    // Parameter indices of "Pad" and "Trigger", meter indices of "Pads" and "Active Voices".
    FoleyPadGrid(zen::EditorLink& link, std::uint32_t pad, std::uint32_t trigger, std::uint32_t pads,
                 std::uint32_t voices, QWidget* parent = nullptr);

    void Refresh(const zen::EditorLink& link) override;

    // What a press and a release of pad `number` (from 1) do.
    void Press(std::uint32_t number);
    void Release();

    std::uint32_t ShownPads() const { return static_cast<std::uint32_t>(m_buttons.size()); }
    const QString& Status() const { return m_status; }

private:
    void ShowPads(std::uint32_t count);

    zen::EditorLink& m_link;
    std::uint32_t m_pad, m_trigger, m_padsMeter, m_voicesMeter;
    const std::uint32_t m_builtInPads;
    std::uint32_t m_lastPlayed = 0;
    QGridLayout* m_grid;
    QLabel* m_statusLabel;
    std::vector<QPushButton*> m_buttons;
    QString m_status;
};
