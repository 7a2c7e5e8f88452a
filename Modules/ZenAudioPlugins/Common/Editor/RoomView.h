// A plan of the reverb's room: the floor (length across, width up) to scale,
// the listener at its centre and the source where the reverb puts it (at
// its distance and azimuth, held inside the room), with the dimensions.
#pragma once

#include <QPointF>
#include <QString>
#include <cstdint>

#include "TitledDisplay.h"

class RoomView : public TitledDisplay {
    Q_OBJECT

public:
    // Parameter indices of the room's length, width and height and of the
    // source's distance, in metres.
    RoomView(const QString& title, std::uint32_t length, std::uint32_t width, std::uint32_t height,
             std::uint32_t distance, QWidget* parent = nullptr);

    void Refresh(const zen::EditorLink& link) override;

    // Metres from the listener: x along the length, y along the width.
    static QPointF SourcePosition(float length, float width, float distance);
    QPointF Source() const { return SourcePosition(m_length, m_width, m_distance); }

protected:
    void paintEvent(QPaintEvent* event) override;

private:
    std::uint32_t m_lengthIndex, m_widthIndex, m_heightIndex, m_distanceIndex;
    float m_length = 0.0f, m_width = 0.0f, m_height = 0.0f, m_distance = 0.0f;
};
