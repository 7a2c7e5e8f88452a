// Vertical bars for level and value meters, each over its meter's declared
// range, with its name and reading underneath. Level meters (dB) keep a peak
// hold; value meters (a correlation) fill from zero, or from the bottom of
// a range that does not hold it. Gain reduction hangs from 0 dB down, its
// hold marking the deepest reduction. Meters are named as ZenEditor::FindMeter
// takes them, a name covering every channel's meter; the indices follow the
// link's meter count, which changes with the channel layout.
#pragma once

#include <string>
#include <vector>

#include "EditorDisplay.h"
#include "zen/ParameterInfo.h"

class LevelBars : public EditorDisplay {
    Q_OBJECT

public:
    // A peak hold rests this long, then falls.
    static constexpr double kHoldSeconds = 1.5;
    static constexpr double kFallDecibelsPerSecond = 20.0;
    // Range of a level meter that declares none.
    static constexpr float kDefaultFloor = -60.0f;
    static constexpr float kDefaultCeiling = 6.0f;

    explicit LevelBars(std::vector<std::string> names, QWidget* parent = nullptr);

    void Refresh(const zen::EditorLink& link) override;

    struct Bar {
        std::uint32_t meter = 0;
        zen::MeterInfo info;
        float value = 0.0f;
        float hold = 0.0f;
        int holdAge = 0;  // refreshes since the hold was set
        bool hangs = false;  // a reduction, drawn from the top of its range
    };
    const std::vector<Bar>& Bars() const { return m_bars; }

    // The meters the names take among the link's meters, in meter order.
    static std::vector<std::uint32_t> Resolve(const zen::EditorLink& link, const std::vector<std::string>& names);

    QSize sizeHint() const override;
    QSize minimumSizeHint() const override;

protected:
    void paintEvent(QPaintEvent* event) override;

private:
    double ColumnWidth() const;

    std::vector<std::string> m_names;
    std::vector<Bar> m_bars;
    std::uint32_t m_meterCount = 0;
    bool m_resolved = false;
};
