#include "TransferCurve.h"

#include <cmath>

std::vector<QPointF> TransferCurve::Points(const Law& law, const std::vector<double>& inputs, double makeupDb) {
    std::vector<QPointF> points;
    points.reserve(inputs.size());
    for (double x : inputs) points.emplace_back(x, x + law(x) + makeupDb);
    return points;
}

std::optional<QPointF> TransferCurve::OperatingPoint(const Law& law, double gainDb, double lowDb, double highDb,
                                                     double makeupDb) {
    double lowGain = law(lowDb), highGain = law(highDb);
    const bool rising = highGain > lowGain;
    if (std::fabs(highGain - lowGain) < kGainTolerance) return std::nullopt;
    if (gainDb < std::fmin(lowGain, highGain) - kGainTolerance ||
        gainDb > std::fmax(lowGain, highGain) + kGainTolerance)
        return std::nullopt;
    // At a flat end of the law (open, or at a floor) the level is unknown.
    if (std::fabs(gainDb - (rising ? highGain : lowGain)) < kGainTolerance) return std::nullopt;
    if (std::fabs(gainDb - (rising ? lowGain : highGain)) < kGainTolerance) return std::nullopt;
    for (int i = 0; i < 60 && highDb - lowDb > 1e-4; ++i) {
        const double mid = 0.5 * (lowDb + highDb);
        const double g = law(mid);
        if ((g < gainDb) == rising)
            lowDb = mid;
        else
            highDb = mid;
    }
    const double x = 0.5 * (lowDb + highDb);
    return QPointF(x, x + law(x) + makeupDb);
}
