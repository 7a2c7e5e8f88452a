#include "OscillatorDocument.h"

#include "AudioFormatFields.h"

namespace zen::host {

const DocumentSchema& OscillatorDocument::Schema() {
    static const DocumentSchema schema = [] {
        SectionSchema tone;
        tone.element = "Tone";
        tone.label = "Tone";
        tone.fields = {
            ChoiceField("signal", "Signal", {"sine", "pink", "white", "sweep"}, kSine),
            NumberField("level", "Level", kMinimumLevel, 0.0, -20.0, 0.01, "dB"),
            NumberField("frequency", "Frequency", kMinimumFrequency, kMaximumFrequency, 1000.0, 0.01, "Hz", true),
            NumberField("sweepEnd", "Sweep End", kMinimumFrequency, kMaximumFrequency, 20000.0, 0.01, "Hz", true),
            NumberField("duration", "Duration", 0.01, kMaximumDuration, 10.0, 0.01, "s"),
            IntegerField("channel", "Channel", 0, static_cast<double>(kMaximumChannels), 0),
            IntegerField("channels", "Channels", 1, static_cast<double>(kMaximumChannels), 2),
            AudioFormatFields::SampleRate()};
        DocumentSchema s;
        s.root = "OscillatorSettings";
        s.sections = {tone};
        s.check = [](const SettingsDocument& d, DocumentFault& fault) {
            const Tone t = Read(d);
            const double nyquist = t.sampleRate / 2.0;
            if (t.frequency >= nyquist || (t.signal == kSweep && t.sweepEnd >= nyquist))
                fault = {"frequencies must stay below half the sample rate (" + FormatNumber(nyquist) + " Hz)",
                         kToneSection, 0};
            else if (t.channel > t.channels)
                fault = {"channel " + std::to_string(t.channel) + " is beyond the " + std::to_string(t.channels) +
                             " channels",
                         kToneSection, 0};
            else
                return true;
            return false;
        };
        return s;
    }();
    return schema;
}

OscillatorDocument::Tone OscillatorDocument::Read(const SettingsDocument& d) {
    Tone t;
    t.signal = static_cast<Signal>(d.ChoiceIndex(kToneSection, 0, kSignal));
    t.levelDb = d.Number(kToneSection, 0, kLevel);
    t.frequency = d.Number(kToneSection, 0, kFrequency);
    t.sweepEnd = d.Number(kToneSection, 0, kSweepEnd);
    t.duration = d.Number(kToneSection, 0, kDuration);
    t.channel = static_cast<int>(d.Number(kToneSection, 0, kChannel));
    t.channels = static_cast<int>(d.Number(kToneSection, 0, kChannels));
    t.sampleRate = AudioFormatFields::Value(d, kToneSection, 0, kSampleRate);
    return t;
}

}  // namespace zen::host
