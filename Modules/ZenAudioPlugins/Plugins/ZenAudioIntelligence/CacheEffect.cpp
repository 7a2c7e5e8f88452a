#include "CacheEffect.h"

#include <algorithm>
#include <cmath>

std::int32_t CacheEffect::GainTenths(float gain) noexcept {
    if (!(gain > 0.0f)) return kFloorTenths;
    if (gain == 1.0f) return 0;
    const double tenths = std::floor(200.0 * std::log10(static_cast<double>(gain)) + 1e-8);
    return static_cast<std::int32_t>(std::max(tenths, static_cast<double>(kFloorTenths)));
}

std::int32_t CacheEffect::PeakTenths(float peak) noexcept {
    if (peak >= 1.0f) return 0;
    return GainTenths(std::max(peak, kPeakFloor));
}

CacheEffect::Record CacheEffect::MakeRecord(float gain, float largest, float smallest, std::int32_t speech,
                                            std::int32_t input) noexcept {
    Record r{};
    r[kGain] = static_cast<float>(GainTenths(gain));
    r[kMax] = largest;
    r[kMin] = smallest;
    r[kPeak] = static_cast<float>(PeakTenths(std::max(largest, -smallest)));
    r[kSpeech] = static_cast<float>(speech);
    r[kInput] = static_cast<float>(input);
    return r;
}
