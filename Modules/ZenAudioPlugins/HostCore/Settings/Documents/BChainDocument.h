// "B-Chain Control": per output channel of the monitor path a gain, a delay
// (sample-exact), a polarity and a small parametric EQ for room tuning.
#pragma once

#include <array>
#include <cstddef>
#include <vector>

#include "HostCore/Settings/SettingsDocument.h"

namespace zen::host {

class BChainDocument {
public:
    static constexpr std::size_t kChannels = 16;
    static constexpr std::size_t kBands = 4;
    static constexpr double kMinimumGain = -40.0;  // dB
    static constexpr double kMaximumGain = 12.0;
    static constexpr double kMaximumDelay = 100.0;    // ms: 34 m of air
    static constexpr double kMaximumBandGain = 18.0;  // dB, the BiQuad's range
    static constexpr double kMinimumFrequency = 20.0;
    static constexpr double kMaximumFrequency = 20000.0;
    static constexpr double kMinimumQ = 0.1;
    static constexpr double kMaximumQ = 15.0;
    static constexpr double kDefaultQ = 1.0;
    static constexpr double kDefaultBandFrequencies[kBands] = {100.0, 500.0, 2000.0, 8000.0};

    enum Section : std::size_t { kChannelSection };
    enum Field : std::size_t { kGain, kDelay, kPolarity, kFirstBandField };
    enum BandField : std::size_t { kBandShape, kBandFrequency, kBandGain, kBandQ, kBandFieldCount };
    enum Shape : int { kOff, kBell, kLowShelf, kHighShelf, kLowPass, kHighPass };

    struct Band {
        Shape shape = kOff;
        double frequency = 1000.0;
        double gainDb = 0.0;
        double q = kDefaultQ;
    };
    struct Channel {
        double gainDb = 0.0;
        double delayMs = 0.0;
        bool inverted = false;
        std::array<Band, kBands> bands{};
    };

    static const DocumentSchema& Schema();
    static std::size_t BandField(std::size_t band, BandField field) {
        return kFirstBandField + band * kBandFieldCount + field;
    }
    static std::vector<Channel> Read(const SettingsDocument& document);
};

}  // namespace zen::host
