// "TalkbackSettings": the talkback microphone's device input and level, the
// outputs it is sent to, how far the main monitor dims while talking, and
// whether the talk key latches or acts only while held.
#pragma once

#include <cstddef>

#include "HostCore/Settings/SettingsDocument.h"

namespace zen::host {

class TalkbackDocument {
public:
    static constexpr std::size_t kMaximumOutputs = 32;
    static constexpr double kMinimumDim = -60.0;  // dB

    enum Section : std::size_t { kTalkbackSection, kDestinationSection };
    enum TalkbackField : std::size_t { kSource, kLevel, kDim, kMode };
    enum DestinationField : std::size_t { kOutput };
    enum Mode : int { kMomentary, kLatch };

    static const DocumentSchema& Schema();
};

}  // namespace zen::host
