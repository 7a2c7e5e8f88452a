// The bundle's Turtle: manifest.ttl and one description file per registered
// plug-in, written from the catalog and each layout's port map.
#pragma once

#include <string>
#include <utility>
#include <vector>

#include "Catalog.h"
#include "PortMap.h"

namespace zenlv2 {

// A factory preset as LV2 hosts list it: the values of the parameter ports,
// offered to every layout of its plug-in.
struct Preset {
    std::string uri;
    std::string label;
    std::string file;                    // the description file holding it
    std::vector<std::string> appliesTo;  // variant URIs
    std::vector<std::pair<std::string, float>> values;  // port symbol, value
};

class TurtleWriter {
public:
    // Description file of a registry key: "soft-clipper-1517179747.ttl".
    static std::string FileName(const std::string& key);

    // Every variant with the shared binary and its description file, every
    // preset with the file that holds its values, and with `uiBinary` each
    // variant's Qt 5 UI in it.
    static std::string Manifest(const std::vector<Variant>& variants, const std::string& binary,
                                const std::vector<Preset>& presets, const std::string& uiBinary = {});

    // "urn:zenaudioplugins:Soft%20Clipper:1517179747:preset:Gentle%20Rounding".
    static std::string PresetUri(const std::string& key, const std::string& name);

    static std::string PresetData(const Preset& preset);

    static std::string Prefixes();

    // The project every plug-in belongs to, with its maintainer.
    static std::string Project();

    // One variant: plug-in, port groups and ports.
    static std::string Plugin(const Variant& variant, const PortMap& ports);

    // The variant's Qt 5 UI: the plug-in names it, and asks the host to send
    // it the latency, enabled and meter ports.
    static std::string Ui(const Variant& variant, const PortMap& ports);

    // Shortest decimal that reads back as the same float, always with a
    // point or an exponent so Turtle types it as a number, not an integer.
    static std::string Number(float value);

    // A Turtle string literal.
    static std::string Quoted(const std::string& text);

    // units:db for "dB", units:hz for "Hz", ...; other units as a described
    // units:Unit node; empty for no unit.
    static std::string Unit(const std::string& unit);
};

}  // namespace zenlv2
