// What the editor draws of each processed block: the smoothed gain, the
// output's extremes and peak, and the current entry's display values. The
// plug-in appends one record per block to its "Gain History" ring meter, a
// single-writer ring that editors drain with cursors of their own.
#pragma once

#include <array>
#include <cstdint>

class CacheEffect {
public:
    enum Field : std::uint32_t { kGain, kMax, kMin, kPeak, kSpeech, kInput, kRecordWidth };
    using Record = std::array<float, kRecordWidth>;

    static constexpr std::int32_t kFloorTenths = -1000;
    static constexpr float kPeakFloor = 1e-7f;

    // Tenths of a dB: floor(200 log10(x) + 1e-8), at least -1000; -1000 for
    // zero and below. Exactly 1 gives 0; above 1 is positive.
    static std::int32_t GainTenths(float gain) noexcept;
    // The same for a peak, 0 at full scale and above.
    static std::int32_t PeakTenths(float peak) noexcept;

    // The block's record: smoothed gain, largest and smallest output sample,
    // and the entry's speech share and measured input (tenths).
    static Record MakeRecord(float gain, float largest, float smallest, std::int32_t speech,
                             std::int32_t input) noexcept;
};
