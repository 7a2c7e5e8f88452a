// The bundle's Turtle: manifest.ttl and one description file per registered
// plug-in, written from the catalog and each layout's port map.
#pragma once

#include <string>
#include <vector>

#include "Catalog.h"
#include "PortMap.h"

namespace zenlv2 {

class TurtleWriter {
public:
    // Description file of a registry key: "soft-clipper-1517179747.ttl".
    static std::string FileName(const std::string& key);

    // Every variant with the shared binary and its description file.
    static std::string Manifest(const std::vector<Variant>& variants, const std::string& binary);

    static std::string Prefixes();

    // The project every plug-in belongs to, with its maintainer.
    static std::string Project();

    // One variant: plug-in, port groups and ports.
    static std::string Plugin(const Variant& variant, const PortMap& ports);

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
