#include "LfeChoice.h"

#include <QCoreApplication>
#include <cmath>

#include "LoudnessMeter.h"
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

int LfeChoice::ApplyWeights(LoudnessMeter& meter, float choice) {
    const auto channels = static_cast<std::size_t>(meter.GetChannelCount());
    const int lfe = Channel(channels, choice);
    for (std::size_t c = 0; c < channels; ++c) meter.SetChannelWeight(c, SpeakerLayout::LoudnessWeight(channels, c, lfe));
    return lfe;
}

}  // namespace zen
