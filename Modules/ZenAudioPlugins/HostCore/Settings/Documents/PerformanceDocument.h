// "Performance Testing": the rate, block size, channel count and length at
// which every audio plug-in of the library is run on the null device, and
// which plug-ins (all when the list is empty).
#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "HostCore/Settings/SettingsDocument.h"

namespace zen::host {

class PerformanceDocument {
public:
    static constexpr std::size_t kMaximumChannels = 32;
    static constexpr double kMaximumDuration = 600.0;  // audio seconds per plug-in

    enum Section : std::size_t { kRunSection };
    enum Field : std::size_t { kSampleRate, kBlockSize, kChannels, kDuration, kPlugins };

    struct Run {
        int sampleRate = 48000;
        int blockSize = 512;
        int channels = 2;
        double duration = 5.0;
        std::vector<std::string> plugins;  // display names; empty: every plug-in
    };

    static const DocumentSchema& Schema();
    static Run Read(const SettingsDocument& document);
};

}  // namespace zen::host
