#include "TurtleWriter.h"

#include <cctype>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <sstream>

namespace zenlv2 {

namespace {

constexpr const char* kProjectUri = "urn:zenaudioplugins";

struct KnownUnit {
    const char* text;
    const char* resource;
};

constexpr KnownUnit kKnownUnits[] = {
    {"dB", "units:db"},     {"Hz", "units:hz"},       {"kHz", "units:khz"},     {"ms", "units:ms"},
    {"s", "units:s"},       {"%", "units:pc"},        {"samples", "units:frame"}, {"st", "units:semitone12TET"},
    {"semitones", "units:semitone12TET"}, {"cents", "units:cent"}, {"ct", "units:cent"}, {"bpm", "units:bpm"},
    {"°", "units:degree"},  {"oct", "units:oct"},     {"m", "units:m"},         {"cm", "units:cm"},
};

bool IsWhole(float value) { return std::isfinite(value) && std::floor(value) == value; }

// The group class of a channel count; the channels keep the library's WAV
// order (L R C LFE, then the surrounds) and each port names its loudspeaker.
const char* GroupClass(std::uint32_t channels) {
    switch (channels) {
        case 1: return "pg:MonoGroup";
        case 2: return "pg:StereoGroup";
        case 6: return "pg:FivePointOneGroup";
        case 8: return "pg:SevenPointOneGroup";
        default: return "pg:DiscreteGroup";
    }
}

std::string Group(const std::string& uri, const char* direction, std::uint32_t channels, bool input) {
    std::ostringstream out;
    out << "<" << uri << ":" << direction << ">\n\ta " << GroupClass(channels) << " ,\n\t\t"
        << (input ? "pg:InputGroup" : "pg:OutputGroup") << " ;\n\tlv2:symbol \"" << direction
        << "\" ;\n\trdfs:label \"" << (input ? "Input" : "Output") << "\" .\n\n";
    return out.str();
}

// Empty where the layout names no loudspeaker for the channel.
const char* Designation(std::uint32_t channel, std::uint32_t channels) {
    static constexpr const char* kSurround[] = {"pg:left",     "pg:right",     "pg:center",   "pg:lowFrequencyEffects",
                                                "pg:rearLeft", "pg:rearRight", "pg:sideLeft", "pg:sideRight"};
    switch (channels) {
        case 1: return "pg:center";
        case 2: return channel == 0 ? "pg:left" : "pg:right";
        case 6:  // L R C LFE Ls Rs: the 3-2 surrounds are LV2's rear pair
        case 8:  // L R C LFE Lb Rb Ls Rs
            return channel < channels ? kSurround[channel] : "";
        default: return "";
    }
}

void Range(std::ostringstream& out, float minimum, float maximum, float defaultValue) {
    out << " ;\n\t\tlv2:default " << TurtleWriter::Number(defaultValue) << " ;\n\t\tlv2:minimum "
        << TurtleWriter::Number(minimum) << " ;\n\t\tlv2:maximum " << TurtleWriter::Number(maximum);
}

void ParameterProperties(std::ostringstream& out, const zen::ParameterInfo& info) {
    Range(out, info.minimum, info.maximum, info.defaultValue);
    switch (info.kind) {
        case zen::ParameterKind::Switch: out << " ;\n\t\tlv2:portProperty lv2:toggled , lv2:integer"; break;
        case zen::ParameterKind::List: {
            const bool whole = IsWhole(info.minimum) && IsWhole(info.step);
            out << " ;\n\t\tlv2:portProperty " << (whole ? "lv2:integer , " : "") << "lv2:enumeration";
            for (std::size_t i = 0; i < info.choices.size(); ++i)
                out << " ;\n\t\tlv2:scalePoint [\n\t\t\trdfs:label " << TurtleWriter::Quoted(info.choices[i])
                    << " ;\n\t\t\trdf:value "
                    << TurtleWriter::Number(info.minimum + static_cast<float>(i) * info.step) << "\n\t\t]";
            break;
        }
        case zen::ParameterKind::Continuous:
            // A logarithmic control needs a range above zero in every host.
            if (info.taper == zen::ParameterTaper::Logarithmic && info.minimum > 0.0f)
                out << " ;\n\t\tlv2:portProperty pprops:logarithmic";
            break;
    }
    const std::string unit = TurtleWriter::Unit(info.unit);
    if (!unit.empty()) out << " ;\n\t\tunits:unit " << unit;
}

std::string Ports(const std::string& uri, const PortMap& map) {
    std::ostringstream out;
    bool first = true;
    std::uint32_t index = 0;
    for (const Port& port : map.Ports()) {
        out << (first ? "\tlv2:port [\n" : " , [\n");
        first = false;
        const bool input = port.type == PortType::AudioInput || port.type == PortType::Enabled ||
                           port.type == PortType::Parameter;
        const bool audio = port.type == PortType::AudioInput || port.type == PortType::AudioOutput;
        out << "\t\ta " << (input ? "lv2:InputPort" : "lv2:OutputPort") << " ,\n\t\t\t"
            << (audio ? "lv2:AudioPort" : "lv2:ControlPort") << " ;\n\t\tlv2:index " << index++
            << " ;\n\t\tlv2:symbol " << TurtleWriter::Quoted(port.symbol) << " ;\n\t\tlv2:name "
            << TurtleWriter::Quoted(port.name);
        switch (port.type) {
            case PortType::AudioInput:
            case PortType::AudioOutput: {
                const bool in = port.type == PortType::AudioInput;
                out << " ;\n\t\tpg:group <" << uri << (in ? ":in" : ":out") << ">";
                const std::string designation = Designation(port.source, in ? map.Inputs() : map.Outputs());
                if (!designation.empty()) out << " ;\n\t\tlv2:designation " << designation;
                break;
            }
            case PortType::Enabled:
                out << " ;\n\t\tlv2:designation lv2:enabled ;\n\t\tlv2:portProperty lv2:toggled , lv2:integer";
                Range(out, 0.0f, 1.0f, 1.0f);
                break;
            case PortType::Latency:
                out << " ;\n\t\tlv2:designation lv2:latency ;\n\t\tlv2:portProperty lv2:reportsLatency , "
                       "lv2:integer ;\n\t\tlv2:minimum 0.0 ;\n\t\tunits:unit units:frame";
                break;
            case PortType::Parameter: ParameterProperties(out, port.parameter); break;
            case PortType::Meter: {
                if (port.meter.minimum < port.meter.maximum)
                    out << " ;\n\t\tlv2:minimum " << TurtleWriter::Number(port.meter.minimum)
                        << " ;\n\t\tlv2:maximum " << TurtleWriter::Number(port.meter.maximum);
                const std::string unit = TurtleWriter::Unit(port.meter.unit);
                if (!unit.empty()) out << " ;\n\t\tunits:unit " << unit;
                break;
            }
        }
        out << "\n\t]";
    }
    return out.str();
}

}  // namespace

std::string TurtleWriter::FileName(const std::string& key) {
    std::string name;
    for (char c : key) {
        const auto u = static_cast<unsigned char>(c);
        if (std::isalnum(u)) name += static_cast<char>(std::tolower(u));
        else if (!name.empty() && name.back() != '-') name += '-';
    }
    return name + ".ttl";
}

std::string TurtleWriter::Number(float value) {
    char text[32];
    for (int precision = 6; precision <= 9; ++precision) {
        std::snprintf(text, sizeof(text), "%.*g", precision, static_cast<double>(value));
        if (std::strtof(text, nullptr) == value) break;
    }
    std::string number = text;
    if (number.find_first_of(".e") == std::string::npos) number += ".0";
    return number;
}

std::string TurtleWriter::Quoted(const std::string& text) {
    std::string quoted = "\"";
    for (char c : text) {
        switch (c) {
            case '"': quoted += "\\\""; break;
            case '\\': quoted += "\\\\"; break;
            case '\n': quoted += "\\n"; break;
            case '\r': quoted += "\\r"; break;
            case '\t': quoted += "\\t"; break;
            default: quoted += c;
        }
    }
    return quoted + "\"";
}

std::string TurtleWriter::Unit(const std::string& unit) {
    if (unit.empty()) return {};
    for (const KnownUnit& known : kKnownUnits)
        if (unit == known.text) return known.resource;
    std::string render;
    for (char c : unit) render += c == '%' ? std::string("%%") : std::string(1, c);
    return "[\n\t\t\ta units:Unit ;\n\t\t\trdfs:label " + Quoted(unit) + " ;\n\t\t\tunits:symbol " + Quoted(unit) +
           " ;\n\t\t\tunits:render " + Quoted("%f " + render) + "\n\t\t]";
}

std::string TurtleWriter::Project() {
    return std::string("<") + kProjectUri +
           ">\n\ta doap:Project ;\n\tdoap:name \"ZenAudioPlugins\" ;\n\tdoap:maintainer [\n\t\tfoaf:name "
           "\"ZenAudioPlugins\"\n\t] .\n\n";
}

std::string TurtleWriter::Prefixes() {
    return "@prefix doap: <http://usefulinc.com/ns/doap#> .\n"
           "@prefix foaf: <http://xmlns.com/foaf/0.1/> .\n"
           "@prefix lv2: <http://lv2plug.in/ns/lv2core#> .\n"
           "@prefix rdf: <http://www.w3.org/1999/02/22-rdf-syntax-ns#> .\n"
           "@prefix rdfs: <http://www.w3.org/2000/01/rdf-schema#> .\n"
           "@prefix units: <http://lv2plug.in/ns/extensions/units#> .\n"
           "@prefix pprops: <http://lv2plug.in/ns/ext/port-props#> .\n"
           "@prefix pg: <http://lv2plug.in/ns/ext/port-groups#> .\n"
           "@prefix opts: <http://lv2plug.in/ns/ext/options#> .\n"
           "@prefix bufsz: <http://lv2plug.in/ns/ext/buf-size#> .\n"
           "@prefix state: <http://lv2plug.in/ns/ext/state#> .\n"
           "@prefix pset: <http://lv2plug.in/ns/ext/presets#> .\n"
           "@prefix ui: <http://lv2plug.in/ns/extensions/ui#> .\n"
           "@prefix urid: <http://lv2plug.in/ns/ext/urid#> .\n"
           "@prefix work: <http://lv2plug.in/ns/ext/worker#> .\n\n";
}

std::string TurtleWriter::Manifest(const std::vector<Variant>& variants, const std::string& binary,
                                   const std::vector<Preset>& presets, const std::string& uiBinary) {
    std::ostringstream out;
    out << "# Generated from the plug-in registry at build time; do not edit.\n"
        << "@prefix lv2: <http://lv2plug.in/ns/lv2core#> .\n"
        << "@prefix pset: <http://lv2plug.in/ns/ext/presets#> .\n"
        << "@prefix rdfs: <http://www.w3.org/2000/01/rdf-schema#> .\n"
        << (uiBinary.empty() ? "" : "@prefix ui: <http://lv2plug.in/ns/extensions/ui#> .\n") << "\n";
    for (const Variant& variant : variants) {
        out << "<" << variant.uri << ">\n\ta lv2:Plugin ;\n\tlv2:binary <" << binary << "> ;\n\trdfs:seeAlso <"
            << FileName(variant.key) << "> .\n\n";
        if (!uiBinary.empty())
            out << "<" << Catalog::UiUri(variant) << ">\n\ta ui:Qt5UI ;\n\tui:binary <" << uiBinary
                << "> ;\n\trdfs:seeAlso <" << FileName(variant.key) << "> .\n\n";
    }
    for (const Preset& preset : presets) {
        out << "<" << preset.uri << ">\n\ta pset:Preset";
        for (std::size_t i = 0; i < preset.appliesTo.size(); ++i)
            out << (i == 0 ? " ;\n\tlv2:appliesTo <" : " , <") << preset.appliesTo[i] << ">";
        out << " ;\n\trdfs:seeAlso <" << preset.file << "> .\n\n";
    }
    return out.str();
}

std::string TurtleWriter::PresetUri(const std::string& key, const std::string& name) {
    return Catalog::MakeUri(key, "preset") + ":" + Catalog::PercentEncode(name);
}

std::string TurtleWriter::PresetData(const Preset& preset) {
    std::ostringstream out;
    out << "<" << preset.uri << ">\n\ta pset:Preset ;\n\trdfs:label " << Quoted(preset.label);
    for (std::size_t i = 0; i < preset.values.size(); ++i)
        out << (i == 0 ? " ;\n\tlv2:port [\n" : " , [\n") << "\t\tlv2:symbol " << Quoted(preset.values[i].first)
            << " ;\n\t\tpset:value " << Number(preset.values[i].second) << "\n\t]";
    out << " .\n\n";
    return out.str();
}

std::string TurtleWriter::Plugin(const Variant& variant, const PortMap& ports) {
    std::ostringstream out;
    if (variant.inputs > 0) out << Group(variant.uri, "in", variant.inputs, true);
    out << Group(variant.uri, "out", variant.outputs, false);
    out << "<" << variant.uri << ">\n\ta lv2:Plugin ;\n\tdoap:name " << Quoted(variant.label)
        << " ;\n\tlv2:project <" << kProjectUri << "> ;\n"
        << "\tlv2:optionalFeature lv2:hardRTCapable , urid:map , opts:options"
        << (variant.backgroundWork ? " , work:schedule" : "") << " ;\n"
        << "\topts:supportedOption bufsz:maxBlockLength , bufsz:nominalBlockLength ;\n"
        << "\tlv2:extensionData state:interface" << (variant.backgroundWork ? " , work:interface" : "") << " ;\n";
    if (variant.inputs > 0) out << "\tpg:mainInput <" << variant.uri << ":in> ;\n";
    out << "\tpg:mainOutput <" << variant.uri << ":out> ;\n" << Ports(variant.uri, ports) << " .\n\n";
    return out.str();
}

std::string TurtleWriter::Ui(const Variant& variant, const PortMap& ports) {
    const std::string ui = Catalog::UiUri(variant);
    std::ostringstream out;
    out << "<" << variant.uri << ">\n\tui:ui <" << ui << "> .\n\n<" << ui << ">\n\ta ui:Qt5UI";
    for (const Port& port : ports.Ports()) {
        if (port.type != PortType::Meter && port.type != PortType::Latency && port.type != PortType::Enabled) continue;
        out << " ;\n\tui:portNotification [\n\t\tui:plugin <" << variant.uri << "> ;\n\t\tlv2:symbol "
            << Quoted(port.symbol) << " ;\n\t\tui:protocol ui:floatProtocol\n\t]";
    }
    out << " .\n\n";
    return out.str();
}

}  // namespace zenlv2
