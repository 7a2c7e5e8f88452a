#include "SpeakerLayout.h"

namespace zen {

namespace {

// Azimuths by channel count: ITU-R BS.775 for up to 5.1 (surrounds at
// +-110), BS.2051's 7.1 (sides at +-90, backs at +-135), Cs behind.
constexpr double kAzimuths[SpeakerLayout::kKnownLayouts][SpeakerLayout::kKnownLayouts] = {
    {0},
    {-30, 30},
    {-30, 30, 0},
    {-30, 30, -110, 110},
    {-30, 30, 0, -110, 110},
    {-30, 30, 0, 0, -110, 110},
    {-30, 30, 0, 0, -110, 110, 180},
    {-30, 30, 0, 0, -135, 135, -90, 90},
};

constexpr int kLfeChannel = 3;  // of 5.1, 6.1 and 7.1

}  // namespace

int SpeakerLayout::DefaultLfe(std::size_t channels) {
    return channels >= 6 && channels <= kKnownLayouts ? kLfeChannel : kNoLfe;
}

bool SpeakerLayout::IsSurround(std::size_t channels, std::size_t channel) {
    switch (channels) {
        case 4: return channel >= 2;
        case 5: return channel >= 3;
        case 6:
        case 7:
        case 8: return channel >= 4 && channel < channels;
        default: return false;
    }
}

double SpeakerLayout::LoudnessWeight(std::size_t channels, std::size_t channel, int lfe) {
    if (lfe >= 0 && channel == static_cast<std::size_t>(lfe)) return 0.0;
    return IsSurround(channels, channel) ? kSurroundWeight : 1.0;
}

double SpeakerLayout::Azimuth(std::size_t channels, std::size_t channel) {
    if (!HasAzimuths(channels) || channel >= channels) return 0.0;
    return kAzimuths[channels - 1][channel];
}

}  // namespace zen
