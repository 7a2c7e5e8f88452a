#include "TalkbackDocument.h"

#include <set>
#include <string>

namespace zen::host {

const DocumentSchema& TalkbackDocument::Schema() {
    static const DocumentSchema schema = [] {
        const double outputs = static_cast<double>(kMaximumOutputs);
        SectionSchema talkback;
        talkback.element = "Talkback";
        talkback.label = "Talkback";
        talkback.fields = {IntegerField("source", "Source", 1, outputs, 1),
                           NumberField("level", "Level", -40.0, 12.0, 0.0, 0.1, "dB"),
                           NumberField("dim", "Dim", kMinimumDim, 0.0, -20.0, 0.1, "dB"),
                           ChoiceField("mode", "Mode", {"momentary", "latch"}, kMomentary)};
        SectionSchema destination;
        destination.element = "Destination";
        destination.label = "Destination";
        destination.minimumCount = 0;
        destination.maximumCount = kMaximumOutputs;
        destination.fields = {IntegerField("output", "Output", 1, outputs, 1)};
        DocumentSchema s;
        s.root = "TalkbackSettings";
        s.sections = {talkback, destination};
        s.check = [](const SettingsDocument& d, DocumentFault& fault) {
            std::set<double> seen;
            for (std::size_t r = 0; r < d.RecordCount(kDestinationSection); ++r)
                if (!seen.insert(d.Number(kDestinationSection, r, kOutput)).second) {
                    fault = {"output " + FormatNumber(d.Number(kDestinationSection, r, kOutput)) + " is listed twice",
                             kDestinationSection, r};
                    return false;
                }
            return true;
        };
        return s;
    }();
    return schema;
}

}  // namespace zen::host
