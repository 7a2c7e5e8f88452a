#include "IOInterfaceDocument.h"

#include "AudioFormatFields.h"

namespace zen::host {

namespace {

// One record per device channel, routed one to one until the user changes it.
SectionSchema Routing(const char* element, const char* label, FieldSchema route, std::size_t section) {
    SectionSchema routing;
    routing.element = element;
    routing.label = label;
    routing.minimumCount = routing.maximumCount = IOInterfaceDocument::kMaximumChannels;
    routing.fields = {std::move(route)};
    routing.recordDefaults = [section](std::size_t r, SettingsDocument& d) {
        d.SetNumber(section, r, 0, static_cast<double>(r + 1));
    };
    return routing;
}

}  // namespace

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
        DocumentSchema s;
        s.root = "IOInterfaceSettings";
        s.sections = {device,
                      Routing("Input", "Input", IntegerField("channel", "Channel", 0, channels, 0), kInputSection),
                      Routing("Output", "Output", IntegerField("source", "Source", 0, channels, 0), kOutputSection)};
        s.check = [](const SettingsDocument& d, DocumentFault& fault) {
            if (d.ChoiceIndex(kDeviceSection, 0, kDevice) == kFileDevice &&
                d.Text(kDeviceSection, 0, kOutputFile).empty()) {
                fault = {"the file device needs an outputFile", kDeviceSection, 0};
                return false;
            }
            return true;
        };
        return s;
    }();
    return schema;
}

IOInterfaceDocument::Interface IOInterfaceDocument::Read(const SettingsDocument& d) {
    Interface io;
    io.device = static_cast<Device>(d.ChoiceIndex(kDeviceSection, 0, kDevice));
    io.sampleRate = AudioFormatFields::Value(d, kDeviceSection, 0, kSampleRate);
    io.blockSize = AudioFormatFields::Value(d, kDeviceSection, 0, kBlockSize);
    io.inputs = static_cast<int>(d.Number(kDeviceSection, 0, kInputs));
    io.outputs = static_cast<int>(d.Number(kDeviceSection, 0, kOutputs));
    io.inputFile = d.Text(kDeviceSection, 0, kInputFile);
    io.outputFile = d.Text(kDeviceSection, 0, kOutputFile);
    for (std::size_t c = 0; c < kMaximumChannels; ++c) {
        io.inputRouting[c] = static_cast<int>(d.Number(kInputSection, c, kInputChannel));
        io.outputRouting[c] = static_cast<int>(d.Number(kOutputSection, c, kOutputSource));
    }
    return io;
}

}  // namespace zen::host
