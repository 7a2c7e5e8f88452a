#include "LfeChoice.h"

#include <QCoreApplication>
#include <cmath>

#include "SpeakerLayout.h"

namespace zen {

ParameterDefinition LfeChoice::Parameter() {
    ParameterDefinition d = ListParameter("LFE_CHANNEL", QT_TRANSLATE_NOOP("LfeChoice", "LFE Channel"),
                                          {QT_TRANSLATE_NOOP("LfeChoice", "Auto"), QT_TRANSLATE_NOOP("LfeChoice", "None")},
                                          static_cast<float>(kAuto));
    for (int c = 1; c <= kChannels; ++c) d.choices << QString::number(c);
    d.maximum = static_cast<float>(d.choices.size() - 1);
    return d;
}

int LfeChoice::Channel(std::size_t channels, float choice) {
    const int value = static_cast<int>(std::lround(choice));
    if (value == kAuto) return SpeakerLayout::DefaultLfe(channels);
    const int channel = value - kFirstChannel;
    return channel >= 0 && static_cast<std::size_t>(channel) < channels ? channel : SpeakerLayout::kNoLfe;
}

}  // namespace zen
