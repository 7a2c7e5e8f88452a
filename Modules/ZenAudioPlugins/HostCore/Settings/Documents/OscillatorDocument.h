// "Test Tones Settings": the test signal (sine, pink or white noise, a
// logarithmic sweep), its level, frequency, length and channel.
#pragma once

#include <cstddef>

#include "HostCore/Settings/SettingsDocument.h"

namespace zen::host {

class OscillatorDocument {
public:
    static constexpr std::size_t kMaximumChannels = 32;
    static constexpr double kMinimumLevel = -140.0;  // dBFS
    static constexpr double kMinimumFrequency = 10.0;
    static constexpr double kMaximumFrequency = 96000.0;
    static constexpr double kMaximumDuration = 3600.0;  // s

    enum Section : std::size_t { kToneSection };
    enum Field : std::size_t { kSignal, kLevel, kFrequency, kSweepEnd, kDuration, kChannel, kChannels, kSampleRate };
    enum Signal : int { kSine, kPink, kWhite, kSweep };

    // Levels are those of a sine of the same RMS (0 dBFS: a full-scale sine),
    // so a sine's level is its peak and noise sits 3.01 dB above its RMS.
    struct Tone {
        Signal signal = kSine;
        double levelDb = -20.0;
        double frequency = 1000.0;
        double sweepEnd = 20000.0;
        double duration = 10.0;
        int channel = 0;  // 0: every channel
        int channels = 2;
        int sampleRate = 48000;
    };

    static const DocumentSchema& Schema();
    static Tone Read(const SettingsDocument& document);
};

}  // namespace zen::host
