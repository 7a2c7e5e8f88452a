// Level conversions shared by every plug-in and algorithm.
#pragma once

#include <algorithm>
#include <cmath>

namespace zen {

// Smallest normal float: the floor of gains that must not reach zero.
constexpr float kSmallestNormalGain = 1.1754944e-38f;

// Level shown for silence by meters that read in decibels.
constexpr float kMeterFloorDb = -120.0f;

// 10^(dB/20) in double precision, narrowed.
inline float DbToGain(double db) { return static_cast<float>(std::pow(10.0, db / 20.0)); }

// As DbToGain, floored at the smallest normal float.
inline float DbToGainFloored(double db) { return std::max(DbToGain(db), kSmallestNormalGain); }

// 20*log10(gain) for meters: kMeterFloorDb for silence or below.
inline float GainToMeterDb(float gain) {
    if (!(gain > 0.0f)) return kMeterFloorDb;
    return std::max(20.0f * std::log10(gain), kMeterFloorDb);
}

}  // namespace zen
