// Where a surround mix sits: the energy vector of the channels' powers on
// their loudspeakers' azimuths (Gerzon). Its direction is where the sound
// comes from; its length r (0..1) how focused it is, read as a spread of
// 2 acos(r) degrees: 0 for one loudspeaker, 60 for an equal pair at +-30,
// 180 for sound from all around. The LFE and channels of unknown layouts
// take no part.
#pragma once

#include <array>
#include <cstddef>

#include "SpeakerLayout.h"

namespace zen {

class SurroundImage {
public:
    struct Image {
        double direction = 0.0;  // degrees clockwise from the front, -180..180
        double length = 0.0;     // 0..1
        double spread = 0.0;     // degrees, 0..180
        bool valid = false;      // false for silence or no known layout
    };

    // Azimuths of the layout of `channels`, without the channel `lfe`.
    void Configure(std::size_t channels, int lfe);
    bool HasLayout() const { return m_channels > 0; }
    // From the channels' powers (mean squares, any weighting).
    Image Compute(const double* powers) const noexcept;

private:
    std::size_t m_channels = 0;  // 0: no known layout
    std::array<double, SpeakerLayout::kKnownLayouts> m_x{};  // sin(azimuth)
    std::array<double, SpeakerLayout::kKnownLayouts> m_y{};  // cos(azimuth)
    std::array<bool, SpeakerLayout::kKnownLayouts> m_used{};
};

}  // namespace zen
