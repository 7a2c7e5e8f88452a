// Two cycles of a modulation plug-in's LFO, drawn by the plug-in's own Lfo
// from the live "Shape", "Rate", "Sync" and "Tempo", over time in seconds.
#pragma once

#include <cstdint>

#include "CurveDisplay.h"

class ZenEditor;

class LfoDisplay : public CurveDisplay {
    Q_OBJECT

public:
    static constexpr int kCurvePoints = 256;
    static constexpr double kCycles = 2.0;

    // Parameter indices; the shape is a list in Lfo::Shape order.
    LfoDisplay(const QString& title, std::uint32_t rate, std::uint32_t sync, std::uint32_t tempo, std::uint32_t shape,
               QWidget* parent = nullptr);

    // On the editor's "RATE", "SYNC", "TEMPO" and "SHAPE"; null when one is missing.
    static LfoDisplay* Create(const ZenEditor& editor, const QString& title);

    // The rate the LFO runs at (Hz), as the plug-in computes it.
    double Hertz() const { return m_hertz; }

private:
    void Read(const zen::EditorLink& link);

    std::uint32_t m_rate, m_sync, m_tempo, m_shape;
    float m_values[4] = {-1.0f, -1.0f, -1.0f, -1.0f};
    double m_hertz = 0.0;
};
