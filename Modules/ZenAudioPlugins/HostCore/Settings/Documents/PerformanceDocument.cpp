#include "PerformanceDocument.h"

#include "AudioFormatFields.h"

namespace zen::host {

namespace {

std::string Trim(const std::string& text) {
    const std::size_t first = text.find_first_not_of(' ');
    if (first == std::string::npos) return {};
    return text.substr(first, text.find_last_not_of(' ') - first + 1);
}

}  // namespace

const DocumentSchema& PerformanceDocument::Schema() {
    static const DocumentSchema schema = [] {
        SectionSchema run;
        run.element = "Run";
        run.label = "Run";
        run.fields = {AudioFormatFields::SampleRate(), AudioFormatFields::BlockSize(),
                      IntegerField("channels", "Channels", 1, static_cast<double>(kMaximumChannels), 2),
                      NumberField("duration", "Duration", 0.1, kMaximumDuration, 5.0, 0.1, "s"),
                      TextField("plugins", "Plug-ins", "", 4096)};
        DocumentSchema s;
        s.root = "PerformanceTesting";
        s.sections = {run};
        return s;
    }();
    return schema;
}

PerformanceDocument::Run PerformanceDocument::Read(const SettingsDocument& d) {
    Run run;
    run.sampleRate = AudioFormatFields::Value(d, kRunSection, 0, kSampleRate);
    run.blockSize = AudioFormatFields::Value(d, kRunSection, 0, kBlockSize);
    run.channels = static_cast<int>(d.Number(kRunSection, 0, kChannels));
    run.duration = d.Number(kRunSection, 0, kDuration);
    // A comma-separated list of display names.
    const std::string& list = d.Text(kRunSection, 0, kPlugins);
    std::size_t start = 0;
    while (start <= list.size()) {
        const std::size_t comma = std::min(list.find(',', start), list.size());
        const std::string name = Trim(list.substr(start, comma - start));
        if (!name.empty()) run.plugins.push_back(name);
        start = comma + 1;
    }
    return run;
}

}  // namespace zen::host
