// Every LV2 plug-in the bundle offers: one per registered audio plug-in and
// channel layout it accepts (mono, stereo, mono to stereo, 5.1, 7.1; outputs
// only for plug-ins without audio input). The adapter and the .ttl generator build it
// the same way from the same library, so URIs and layouts always agree.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "Library.h"

namespace zenlv2 {

// Prefix of every plug-in URI; the registry key and the layout follow.
constexpr const char* kUriPrefix = "urn:zenaudioplugins:";

struct Variant {
    std::string key;   // registry key, "Soft Clipper:1517179747"
    std::string name;  // display name, "Soft Clipper"
    std::uint32_t inputs = 0;
    std::uint32_t outputs = 0;
    std::string layout;  // "mono", "stereo", "mono-to-stereo", "5.1", "7.1"
    std::string uri;     // "urn:zenaudioplugins:Soft%20Clipper:1517179747:stereo"
    std::string label;   // "Soft Clipper (Stereo)", or the plain name when it is the only layout
    bool backgroundWork = false;  // the plug-in has a zen::BackgroundTask (it asks for LV2's worker)
};

class Catalog {
public:
    static std::vector<Variant> Build(Library& library);

    // Stable for as long as the key and the layout exist: saved sessions find
    // their plug-in again whatever else the registry gains.
    static std::string MakeUri(const std::string& key, const std::string& layout);

    // The plug-in's UI in that layout: its URI and ":ui".
    static std::string UiUri(const Variant& variant);

    // Percent-encoding of everything outside RFC 3986's unreserved characters.
    static std::string PercentEncode(const std::string& text);

    // "mono", "stereo", "mono-to-stereo", "5.1", "7.1".
    static std::string LayoutName(std::uint32_t inputs, std::uint32_t outputs);
};

}  // namespace zenlv2
