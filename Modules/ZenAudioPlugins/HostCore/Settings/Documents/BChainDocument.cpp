#include "BChainDocument.h"

#include <string>

namespace zen::host {

const DocumentSchema& BChainDocument::Schema() {
    static const DocumentSchema schema = [] {
        SectionSchema channel;
        channel.element = "Channel";
        channel.label = "Channel";
        channel.minimumCount = channel.maximumCount = kChannels;
        channel.fields = {NumberField("gain", "Gain", kMinimumGain, kMaximumGain, 0.0, 0.1, "dB"),
                          NumberField("delay", "Delay", 0.0, kMaximumDelay, 0.0, 0.01, "ms"),
                          ChoiceField("polarity", "Polarity", {"normal", "inverted"}, 0)};
        for (std::size_t b = 0; b < kBands; ++b) {
            const std::string name = "eq" + std::to_string(b + 1);
            const std::string label = "EQ " + std::to_string(b + 1);
            channel.fields.push_back(ChoiceField(name.c_str(), label.c_str(),
                                                 {"off", "bell", "lowshelf", "highshelf", "lowpass", "highpass"}, 0));
            channel.fields.push_back(NumberField((name + "Frequency").c_str(), (label + " Frequency").c_str(),
                                                 kMinimumFrequency, kMaximumFrequency, kDefaultBandFrequencies[b], 1.0,
                                                 "Hz", true));
            channel.fields.push_back(NumberField((name + "Gain").c_str(), (label + " Gain").c_str(), -kMaximumBandGain,
                                                 kMaximumBandGain, 0.0, 0.1, "dB"));
            channel.fields.push_back(
                NumberField((name + "Q").c_str(), (label + " Q").c_str(), kMinimumQ, kMaximumQ, kDefaultQ, 0.01));
        }
        DocumentSchema s;
        s.root = "BChainSettings";
        s.sections = {channel};
        return s;
    }();
    return schema;
}

std::vector<BChainDocument::Channel> BChainDocument::Read(const SettingsDocument& document) {
    std::vector<Channel> channels(kChannels);
    for (std::size_t c = 0; c < kChannels; ++c) {
        Channel& channel = channels[c];
        channel.gainDb = document.Number(kChannelSection, c, kGain);
        channel.delayMs = document.Number(kChannelSection, c, kDelay);
        channel.inverted = document.ChoiceIndex(kChannelSection, c, kPolarity) == 1;
        for (std::size_t b = 0; b < kBands; ++b) {
            Band& band = channel.bands[b];
            band.shape = static_cast<Shape>(document.ChoiceIndex(kChannelSection, c, BandField(b, kBandShape)));
            band.frequency = document.Number(kChannelSection, c, BandField(b, kBandFrequency));
            band.gainDb = document.Number(kChannelSection, c, BandField(b, kBandGain));
            band.q = document.Number(kChannelSection, c, BandField(b, kBandQ));
        }
    }
    return channels;
}

}  // namespace zen::host
