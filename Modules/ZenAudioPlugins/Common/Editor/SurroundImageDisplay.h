// Where a surround mix sits, seen from above with the front up: the
// loudspeakers of the channel count's layout (brighter when louder), the
// direction the sound comes from as an arrow, and its spread as an arc of
// that width centred on it (an equal pair at +-30 degrees fills +-30).
#pragma once

#include <QString>
#include <cstdint>
#include <vector>

#include "TitledDisplay.h"

class SurroundImageDisplay : public TitledDisplay {
    Q_OBJECT

public:
    // Meter indices: direction and spread in degrees (clockwise from the
    // front), and each channel's level in dB.
    SurroundImageDisplay(const QString& title, std::uint32_t direction, std::uint32_t spread,
                         std::vector<std::uint32_t> levels, QWidget* parent = nullptr);

    void Refresh(const zen::EditorLink& link) override;

protected:
    void paintEvent(QPaintEvent* event) override;

private:
    std::uint32_t m_directionMeter, m_spreadMeter;
    std::vector<std::uint32_t> m_levelMeters;
    float m_direction = 0.0f, m_spread = 0.0f;
    std::vector<float> m_levels;  // dB per channel
};
