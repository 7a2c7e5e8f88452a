// The "LFE Channel" choice of the loudness meters: "Auto" takes the layout's
// own LFE (the fourth channel of 5.1, 6.1 and 7.1, none otherwise), "None"
// weighs every channel, "1" to "32" name the channel left out.
#pragma once

#include <cstddef>

#include "../ParameterDefinition.h"

class LoudnessMeter;

namespace zen {

class LfeChoice {
public:
    static constexpr int kAuto = 0;
    static constexpr int kNone = 1;
    static constexpr int kFirstChannel = 2;  // the choice of channel 1
    static constexpr int kChannels = 32;

    // The stepped list parameter "LFE Channel", default "Auto".
    static ParameterDefinition Parameter();
    // The LFE's channel index for a choice, or SpeakerLayout::kNoLfe (also
    // for a channel the layout does not have).
    static int Channel(std::size_t channels, float choice);
    // Weighs the meter's channels for a choice (surrounds +1.5 dB, the LFE
    // left out); returns the LFE's channel. No allocation.
    static int ApplyWeights(LoudnessMeter& meter, float choice);
};

}  // namespace zen
