#include "Catalog.h"

#include <cctype>
#include <cstdio>
#include <string>

namespace zenlv2 {

namespace {

struct Layout {
    std::uint32_t inputs;
    std::uint32_t outputs;
};

// The layouts a user inserts on a track or bus: mono, stereo and the two
// surround formats LV2 names (5.1, 7.1); other widths are left to hosts of
// the library's own interface. Inputs 0: plug-ins without audio input.
constexpr Layout kLayouts[] = {{1, 1}, {1, 2}, {2, 2}, {6, 6}, {8, 8}, {0, 1}, {0, 2}, {0, 6}, {0, 8}};

std::string ChannelsName(std::uint32_t channels) {
    switch (channels) {
        case 1: return "mono";
        case 2: return "stereo";
        case 6: return "5.1";
        case 8: return "7.1";
        default: return std::to_string(channels) + "ch";
    }
}

std::string ChannelsLabel(std::uint32_t channels) {
    switch (channels) {
        case 1: return "Mono";
        case 2: return "Stereo";
        default: return ChannelsName(channels);
    }
}

std::string LayoutLabel(std::uint32_t inputs, std::uint32_t outputs) {
    if (inputs == 0 || inputs == outputs) return ChannelsLabel(outputs);
    return ChannelsLabel(inputs) + " to " + ChannelsLabel(outputs);
}

}  // namespace

std::string Catalog::PercentEncode(const std::string& text) {
    std::string encoded;
    for (char c : text) {
        const auto u = static_cast<unsigned char>(c);
        if (std::isalnum(u) || c == '-' || c == '.' || c == '_' || c == '~') {
            encoded += c;
        } else {
            char escape[4];
            std::snprintf(escape, sizeof(escape), "%%%02X", u);
            encoded += escape;
        }
    }
    return encoded;
}

std::string Catalog::MakeUri(const std::string& key, const std::string& layout) {
    // The key's own colon separates name and code; it stays readable.
    const std::size_t colon = key.rfind(':');
    const std::string encoded = colon == std::string::npos
                                    ? PercentEncode(key)
                                    : PercentEncode(key.substr(0, colon)) + ":" + PercentEncode(key.substr(colon + 1));
    return kUriPrefix + encoded + ":" + layout;
}

std::string Catalog::UiUri(const Variant& variant) { return variant.uri + ":ui"; }

std::string Catalog::LayoutName(std::uint32_t inputs, std::uint32_t outputs) {
    if (inputs == 0 || inputs == outputs) return ChannelsName(outputs);
    return ChannelsName(inputs) + "-to-" + ChannelsName(outputs);
}

std::vector<Variant> Catalog::Build(Library& library) {
    std::vector<Variant> variants;
    if (!library.IsLoaded()) return variants;
    for (const auto& [key, entry] : library.Interface().GetPluginList(zen::kAudioPluginKind)) {
        std::unique_ptr<zen::PluginInstance> instance = library.Create(key);
        if (instance == nullptr) continue;
        AudioPlugin& audio = *zen::InterfaceCast<AudioPlugin>(instance.get());
        const zen::PluginDescriptor& descriptor = *instance->GetDescriptor();
        const std::size_t first = variants.size();
        const bool hasInput = descriptor.inputChannelLimit > 0;
        for (const Layout& layout : kLayouts) {
            if ((layout.inputs > 0) != hasInput || !audio.ConfigureChannels(layout.inputs, layout.outputs)) continue;
            Variant variant;
            variant.key = key;
            variant.name = entry.name;
            variant.inputs = layout.inputs;
            variant.outputs = layout.outputs;
            variant.layout = LayoutName(layout.inputs, layout.outputs);
            variant.uri = MakeUri(key, variant.layout);
            variant.backgroundWork = zen::InterfaceCast<zen::BackgroundTask>(instance.get()) != nullptr;
            variants.push_back(std::move(variant));
        }
        const bool several = variants.size() - first > 1;
        for (std::size_t v = first; v < variants.size(); ++v) {
            Variant& variant = variants[v];
            variant.label = several ? variant.name + " (" + LayoutLabel(variant.inputs, variant.outputs) + ")"
                                    : variant.name;
        }
    }
    return variants;
}

}  // namespace zenlv2
