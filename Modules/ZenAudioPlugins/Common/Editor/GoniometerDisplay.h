// A goniometer: the stereo image as a cloud of points, mid upwards and side
// across, so that a mono signal stands vertical, a left-only one lies on the
// upper-left diagonal and a right-only one on the upper-right. The points
// come from a ring meter of {side, mid} records, drained with this display's
// own cursor; older points fade. Beneath, a bar shows the correlation meter.
#pragma once

#include <QPointF>
#include <QString>
#include <cstdint>
#include <deque>
#include <vector>

#include "TitledDisplay.h"

class GoniometerDisplay : public TitledDisplay {
    Q_OBJECT

public:
    // Points kept on screen: about 85 ms at 48 kHz.
    static constexpr std::size_t kShownPoints = 4096;
    // Refreshes without new points that empty a full cloud (a divisor of
    // kShownPoints).
    static constexpr std::size_t kEmptyingRefreshes = 16;  // about half a second

    // `ring`: the meter of {side, mid} points; `correlation`: a value meter
    // from -1 to +1, or -1 for none.
    GoniometerDisplay(const QString& title, std::uint32_t ring, int correlation, QWidget* parent = nullptr);

    void Refresh(const zen::EditorLink& link) override;

    // In the ring's units {side, mid}, oldest first.
    const std::deque<QPointF>& Points() const { return m_points; }
    float Correlation() const { return m_correlation; }

protected:
    void paintEvent(QPaintEvent* event) override;

private:
    static constexpr std::uint32_t kReadChunk = 1024;
    static constexpr std::size_t kFadeSteps = 8;

    std::uint32_t m_ring;
    int m_correlationMeter;
    std::uint64_t m_cursor = 0;
    std::vector<float> m_buffer;
    std::deque<QPointF> m_points;
    float m_correlation = 0.0f;
};
