// A spectrum of any length on a fixed number of points for meters: `bins`
// and `points` both run evenly from 0 Hz to half the rate. Where several
// bins fall to a point they are averaged, where points outnumber bins they
// are interpolated, so a display sees the same shape at every rate.
#pragma once

#include <cstddef>

namespace zen::noise_reduction {

void zn_spectrum_points(const float* bins, std::size_t binCount, float* points, std::size_t pointCount) noexcept;

// The same in dB: 10 log10 of powers or 20 log10 of gains (`dbPerDecade`),
// never below `floorDb`.
void zn_spectrum_points_db(const float* bins, std::size_t binCount, float* points, std::size_t pointCount,
                           float dbPerDecade, float floorDb) noexcept;

}  // namespace zen::noise_reduction
