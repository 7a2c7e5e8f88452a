#include "RemoteControlDocument.h"

#include <map>
#include <string>

namespace zen::host {

namespace {

// What a binding listens to: two bindings may not listen to the same.
std::string Message(const SettingsDocument& d, std::size_t r) {
    using D = RemoteControlDocument;
    const auto type = static_cast<D::Type>(d.ChoiceIndex(D::kBindingSection, r, D::kType));
    if (type == D::kOsc) return "OSC " + d.Text(D::kBindingSection, r, D::kAddress);
    return std::string(type == D::kNote ? "note " : "CC ") + FormatNumber(d.Number(D::kBindingSection, r, D::kNumber)) +
           " on MIDI channel " + FormatNumber(d.Number(D::kBindingSection, r, D::kMidiChannel));
}

bool IsOscAddress(const std::string& address) {
    if (address.size() < 2 || address[0] != '/') return false;
    for (char c : address)
        if (c == ' ' || c == '#' || c == '*' || c == ',' || c == '?' || c == '[' || c == ']' || c == '{' || c == '}')
            return false;
    return true;
}

}  // namespace

const DocumentSchema& RemoteControlDocument::Schema() {
    static const DocumentSchema schema = [] {
        SectionSchema surface;
        surface.element = "Surface";
        surface.label = "Surface";
        surface.fields = {TextField("midiInput", "MIDI Input"), IntegerField("oscPort", "OSC Port", 1024, 65535, 9000)};
        SectionSchema binding;
        binding.element = "Binding";
        binding.label = "Binding";
        binding.minimumCount = 0;
        binding.maximumCount = kMaximumBindings;
        binding.fields = {ChoiceField("type", "Type", {"cc", "note", "osc"}, kControlChange),
                          IntegerField("midiChannel", "MIDI Channel", 1, 16, 1),
                          IntegerField("number", "Number", 0, 127, 0),
                          TextField("address", "OSC Address"),
                          IntegerField("channel", "Channel", 1, kMaximumStudioChannels, 1),
                          IntegerField("slot", "Slot", 1, kMaximumSlots, 1),
                          TextField("parameter", "Parameter")};
        DocumentSchema s;
        s.root = "RemoteControlSettings";
        s.sections = {surface, binding};
        s.check = [](const SettingsDocument& d, DocumentFault& fault) {
            std::map<std::string, std::size_t> messages;
            for (std::size_t r = 0; r < d.RecordCount(kBindingSection); ++r) {
                fault.section = kBindingSection;
                fault.record = r;
                const bool osc = d.ChoiceIndex(kBindingSection, r, kType) == kOsc;
                if (osc && !IsOscAddress(d.Text(kBindingSection, r, kAddress))) {
                    fault.message = "'" + d.Text(kBindingSection, r, kAddress) +
                                    "' is no OSC address (/name/name, without spaces or patterns)";
                    return false;
                }
                if (d.Text(kBindingSection, r, kParameter).empty()) {
                    fault.message = "names no parameter";
                    return false;
                }
                const auto [it, fresh] = messages.emplace(Message(d, r), r);
                if (!fresh) {
                    fault.message = "binds " + it->first + " again (binding " + std::to_string(it->second + 1) + ")";
                    return false;
                }
            }
            return true;
        };
        return s;
    }();
    return schema;
}

}  // namespace zen::host
