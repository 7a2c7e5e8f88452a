#include "IOInterfaceDocument.h"

#include "AudioFormatFields.h"

namespace zen::host {

const DocumentSchema& IOInterfaceDocument::Schema() {
    static const DocumentSchema schema = [] {
        const double channels = static_cast<double>(kMaximumChannels);
        SectionSchema device;
        device.element = "Device";
        device.label = "Device";
        device.fields = {ChoiceField("device", "Device", {"null", "clocked", "file"}, kClockedNullDevice),
                         AudioFormatFields::SampleRate(),
                         AudioFormatFields::BlockSize(),
                         IntegerField("inputs", "Inputs", 0, channels, 2),
                         IntegerField("outputs", "Outputs", 1, channels, 2),
                         TextField("inputFile", "Input File", "", 4096),
                         TextField("outputFile", "Output File", "", 4096)};
        // Identity routing until the user changes it.
        SectionSchema input;
        input.element = "Input";
        input.label = "Input";
        input.minimumCount = input.maximumCount = kMaximumChannels;
        input.fields = {IntegerField("channel", "Channel", 0, channels, 0)};
        input.recordDefaults = [](std::size_t r, SettingsDocument& d) {
            d.SetNumber(kInputSection, r, kInputChannel, static_cast<double>(r + 1));
        };
        SectionSchema output;
        output.element = "Output";
        output.label = "Output";
        output.minimumCount = output.maximumCount = kMaximumChannels;
        output.fields = {IntegerField("source", "Source", 0, channels, 0)};
        output.recordDefaults = [](std::size_t r, SettingsDocument& d) {
            d.SetNumber(kOutputSection, r, kOutputSource, static_cast<double>(r + 1));
        };
        DocumentSchema s;
        s.root = "IOInterfaceSettings";
        s.sections = {device, input, output};
        s.check = [](const SettingsDocument& d, DocumentFault& fault) {
            if (d.ChoiceIndex(kDeviceSection, 0, kDevice) == kFileDevice && d.Text(kDeviceSection, 0, kOutputFile).empty()) {
                fault = {"the file device needs an outputFile", kDeviceSection, 0};
                return false;
            }
            return true;
        };
        return s;
    }();
    return schema;
}

}  // namespace zen::host
