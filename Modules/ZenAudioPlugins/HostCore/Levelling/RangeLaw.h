// The levelling law drawn by range points: speech at IN LUFS gets GAIN dB,
// straight lines between the points, the outermost point's gain beyond
// them. Points replace "target minus loudness" only while one is set.
#pragma once

#include <cstddef>
#include <utility>
#include <vector>

namespace zen::host {

class LevellingSettings;

class RangeLaw {
public:
    RangeLaw() = default;
    // The points of `settings` whose In lies above the "no point" floor.
    explicit RangeLaw(const LevellingSettings& settings);

    bool Empty() const { return m_points.empty(); }
    // dB for speech at `loudness` LUFS; 0 when no point is set.
    double Gain(double loudness) const;

private:
    std::vector<std::pair<double, double>> m_points;  // (in, gain), by in
};

}  // namespace zen::host
