#include "AudioFormatFields.h"

#include <string>

namespace zen::host {

FieldSchema AudioFormatFields::SampleRate() {
    FieldSchema f = ChoiceField("sampleRate", "Sample Rate", {"44100", "48000", "88200", "96000", "176400", "192000"},
                                kDefaultRateIndex);
    f.unit = "Hz";
    return f;
}

FieldSchema AudioFormatFields::BlockSize() {
    return ChoiceField("blockSize", "Block Size", {"16", "32", "64", "128", "256", "512", "1024", "2048", "4096"},
                       kDefaultBlockIndex);
}

int AudioFormatFields::Value(const SettingsDocument& document, std::size_t section, std::size_t record,
                             std::size_t field) {
    const FieldSchema& f = document.Schema().sections.at(section).fields.at(field);
    return std::stoi(f.choices.at(document.ChoiceIndex(section, record, field)));
}

}  // namespace zen::host
