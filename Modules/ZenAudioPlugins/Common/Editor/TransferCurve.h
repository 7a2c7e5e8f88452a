// Static curves of gain stages (compressors, expanders, gates) for a level
// display: output level against a steady input level, and the operating
// point where a stage's gain meter says it is.
#pragma once

#include <QPointF>
#include <functional>
#include <optional>
#include <vector>

class TransferCurve {
public:
    // The stage's gain (dB, without makeup) at a steady input level (dB):
    // its static law, monotonic in the level.
    using Law = std::function<double(double inputDb)>;

    // (input, input + gain + makeup) at each input level.
    static std::vector<QPointF> Points(const Law& law, const std::vector<double>& inputs, double makeupDb = 0.0);

    // The point of the curve whose gain is `gainDb` (a meter's reading),
    // searched between `lowDb` and `highDb`; none where the law does not
    // reach that gain or holds it over a stretch (a compressor below its
    // knee), since the level is not known there.
    static std::optional<QPointF> OperatingPoint(const Law& law, double gainDb, double lowDb, double highDb,
                                                 double makeupDb = 0.0);

    // Tolerance of the search, in dB of gain.
    static constexpr double kGainTolerance = 0.01;
};
