#include "zn_spectrum_points.h"

#include <algorithm>
#include <cmath>

namespace zen::noise_reduction {

void zn_spectrum_points(const float* bins, std::size_t binCount, float* points, std::size_t pointCount) noexcept {
    if (pointCount == 0) return;
    if (binCount < 2 || pointCount < 2) {
        std::fill(points, points + pointCount, binCount > 0 ? bins[0] : 0.0f);
        return;
    }
    const double step = static_cast<double>(binCount - 1) / static_cast<double>(pointCount - 1);
    const auto last = static_cast<double>(binCount - 1);
    for (std::size_t p = 0; p < pointCount; ++p) {
        const double centre = static_cast<double>(p) * step;
        if (step <= 1.0) {
            const auto i = std::min(static_cast<std::size_t>(centre), binCount - 2);
            const double t = centre - static_cast<double>(i);
            points[p] = static_cast<float>((1.0 - t) * bins[i] + t * bins[i + 1]);
            continue;
        }
        // A band of one step around the point; bins on its edges count half.
        const double lo = centre - 0.5 * step, hi = centre + 0.5 * step;
        const auto begin = static_cast<std::size_t>(std::max(0.0, std::ceil(lo)));
        const auto end = static_cast<std::size_t>(std::min(last, std::floor(hi)));
        double sum = 0.0, weights = 0.0;
        for (std::size_t k = begin; k <= end; ++k) {
            const auto at = static_cast<double>(k);
            const double w = at == lo || at == hi ? 0.5 : 1.0;
            sum += w * bins[k];
            weights += w;
        }
        points[p] = static_cast<float>(sum / weights);
    }
}

void zn_spectrum_points_db(const float* bins, std::size_t binCount, float* points, std::size_t pointCount,
                           float dbPerDecade, float floorDb) noexcept {
    zn_spectrum_points(bins, binCount, points, pointCount);
    const float least = std::pow(10.0f, floorDb / dbPerDecade);
    for (std::size_t p = 0; p < pointCount; ++p) points[p] = dbPerDecade * std::log10(std::max(points[p], least));
}

}  // namespace zen::noise_reduction
