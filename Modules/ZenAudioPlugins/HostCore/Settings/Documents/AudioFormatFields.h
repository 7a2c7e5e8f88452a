// Fields that several documents share: the sample rate and the block size a
// device or a run uses, offered as the usual values.
#pragma once

#include <cstddef>

#include "HostCore/Settings/SettingsDocument.h"

namespace zen::host {

struct AudioFormatFields {
    static constexpr std::size_t kDefaultRateIndex = 1;   // 48000
    static constexpr std::size_t kDefaultBlockIndex = 5;  // 512

    static FieldSchema SampleRate();  // 44100 .. 192000 Hz
    static FieldSchema BlockSize();   // 16 .. 4096 frames
    // The number a choice of these fields stands for.
    static int Value(const SettingsDocument& document, std::size_t section, std::size_t record, std::size_t field);
};

}  // namespace zen::host
