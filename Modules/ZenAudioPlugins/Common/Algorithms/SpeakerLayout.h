// What a channel count means when a file or a host says nothing more: the
// channel order of WAV and SMPTE (L R C LFE, then surrounds), the loudness
// weight of each channel and the loudspeaker's azimuth.
//
//   1 mono   2 L R   3 L R C   4 L R Ls Rs   5 L R C Ls Rs
//   6 L R C LFE Ls Rs (5.1)   7 L R C LFE Ls Rs Cs   8 L R C LFE Lb Rb Ls Rs (7.1)
//
// Other counts have no known layout: weight 1, no LFE, no azimuth.
#pragma once

#include <cstddef>

namespace zen {

class SpeakerLayout {
public:
    static constexpr int kNoLfe = -1;
    // Surround channels count +1.5 dB louder in loudness measurement.
    static constexpr double kSurroundWeight = 1.41;

    // The LFE's channel index in the layout of `channels`, or kNoLfe.
    static int DefaultLfe(std::size_t channels);
    // The weight of `channel` with the LFE at `lfe` (kNoLfe: none): 0 for
    // the LFE, kSurroundWeight for surrounds, else 1.
    static double LoudnessWeight(std::size_t channels, std::size_t channel, int lfe);
    static bool IsSurround(std::size_t channels, std::size_t channel);
    // Whether `channels` has a known layout, so azimuths mean something.
    static bool HasAzimuths(std::size_t channels) { return channels >= 1 && channels <= kKnownLayouts; }
    // Degrees clockwise from the front centre (left negative); 0 for the
    // LFE and for unknown layouts.
    static double Azimuth(std::size_t channels, std::size_t channel);

    static constexpr std::size_t kKnownLayouts = 8;
};

}  // namespace zen
