// zen-lv2-ttl: writes the bundle's .ttl files from the library's registry and
// parameter tables. Run by the build after the library and the adapter.
//
//   zen-lv2-ttl LIBRARY BUNDLE_DIR BINARY_NAME [UI_BINARY_NAME]
#include <dirent.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <map>
#include <memory>
#include <set>

#include "Catalog.h"
#include "PortMap.h"
#include "TurtleWriter.h"

namespace {

bool WriteFile(const std::string& path, const std::string& text) {
    const std::string temporary = path + ".tmp";
    {
        std::ofstream out(temporary, std::ios::binary | std::ios::trunc);
        out << text;
        if (!out.good()) return false;
    }
    return std::rename(temporary.c_str(), path.c_str()) == 0;
}

// Descriptions of plug-ins that left the registry must not linger.
void RemoveStaleFiles(const std::string& folder, const std::set<std::string>& keep) {
    DIR* dir = opendir(folder.c_str());
    if (dir == nullptr) return;
    while (dirent* entry = readdir(dir)) {
        const std::string name = entry->d_name;
        if (name.size() > 4 && name.compare(name.size() - 4, 4, ".ttl") == 0 && keep.count(name) == 0)
            unlink((folder + "/" + name).c_str());
    }
    closedir(dir);
}

// The plug-in's factory presets as port values. Loading a preset into a
// fresh instance and reading every parameter back gives exactly what the
// library would set.
std::vector<zenlv2::Preset> PresetsOf(zenlv2::Library& library, const std::vector<zenlv2::Variant>& variants,
                                      const zenlv2::PortMap& ports) {
    std::vector<zenlv2::Preset> presets;
    const std::string& key = variants.front().key;
    std::map<std::uint32_t, std::string> symbols;  // parameter index -> port symbol
    for (const zenlv2::Port& port : ports.Ports())
        if (port.type == zenlv2::PortType::Parameter) symbols[port.source] = port.symbol;
    auto lister = library.Create(key);
    for (const std::string& name : zen::InterfaceCast<AudioPlugin>(lister.get())->GetPresetNames()) {
        auto instance = library.Create(key);
        AudioPlugin* audio = zen::InterfaceCast<AudioPlugin>(instance.get());
        if (!audio->LoadPreset(name)) continue;
        zenlv2::Preset preset;
        preset.uri = zenlv2::TurtleWriter::PresetUri(key, name);
        preset.label = name;
        preset.file = zenlv2::TurtleWriter::FileName(key);
        for (const zenlv2::Variant& variant : variants) preset.appliesTo.push_back(variant.uri);
        for (const auto& [index, symbol] : symbols) preset.values.emplace_back(symbol, audio->GetParameter(index));
        presets.push_back(std::move(preset));
    }
    return presets;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 4 && argc != 5) {
        std::fprintf(stderr, "usage: zen-lv2-ttl LIBRARY BUNDLE_DIR BINARY_NAME [UI_BINARY_NAME]\n");
        return 2;
    }
    const std::string folder = argv[2];
    const std::string binary = argv[3];
    const std::string uiBinary = argc == 5 ? argv[4] : "";
    // The bundle lists factory presets only: the building user's own presets
    // (read from XDG_DATA_HOME) must not end up in it.
    setenv("XDG_DATA_HOME", "/nonexistent", 1);
    zenlv2::Library library({argv[1]});
    if (!library.IsLoaded()) {
        std::fprintf(stderr, "zen-lv2-ttl: cannot load %s: %s\n", argv[1], library.Error().c_str());
        return 1;
    }
    const std::vector<zenlv2::Variant> variants = zenlv2::Catalog::Build(library);
    if (variants.empty()) {
        std::fprintf(stderr, "zen-lv2-ttl: %s offers no audio plug-in in a mono or stereo layout\n", argv[1]);
        return 1;
    }

    std::map<std::string, std::string> files;  // file name -> text
    std::map<std::string, std::vector<zenlv2::Variant>> layouts;  // key -> its variants
    for (const zenlv2::Variant& variant : variants) layouts[variant.key].push_back(variant);
    std::vector<zenlv2::Preset> presets;
    for (const zenlv2::Variant& variant : variants) {
        auto instance = library.Create(variant.key);
        AudioPlugin* audio = zen::InterfaceCast<AudioPlugin>(instance.get());
        if (audio == nullptr || !audio->ConfigureChannels(variant.inputs, variant.outputs)) {
            std::fprintf(stderr, "zen-lv2-ttl: '%s' cannot be created in its %s layout\n", variant.key.c_str(),
                         variant.layout.c_str());
            return 1;
        }
        std::string& text = files[zenlv2::TurtleWriter::FileName(variant.key)];
        if (text.empty())
            text = "# Generated from the plug-in registry at build time; do not edit.\n" +
                   zenlv2::TurtleWriter::Prefixes() + zenlv2::TurtleWriter::Project();
        const zenlv2::PortMap ports(*audio, variant.inputs, variant.outputs);
        text += zenlv2::TurtleWriter::Plugin(variant, ports);
        if (!uiBinary.empty()) text += zenlv2::TurtleWriter::Ui(variant, ports);
        if (variant.uri == layouts[variant.key].front().uri)
            for (zenlv2::Preset& preset : PresetsOf(library, layouts[variant.key], ports)) {
                text += zenlv2::TurtleWriter::PresetData(preset);
                presets.push_back(std::move(preset));
            }
    }

    std::set<std::string> written = {"manifest.ttl"};
    for (const auto& [name, text] : files) {
        if (!WriteFile(folder + "/" + name, text)) {
            std::fprintf(stderr, "zen-lv2-ttl: cannot write %s/%s\n", folder.c_str(), name.c_str());
            return 1;
        }
        written.insert(name);
    }
    RemoveStaleFiles(folder, written);
    // The manifest last: it is the build's mark that the bundle is complete.
    if (!WriteFile(folder + "/manifest.ttl", zenlv2::TurtleWriter::Manifest(variants, binary, presets, uiBinary))) {
        std::fprintf(stderr, "zen-lv2-ttl: cannot write %s/manifest.ttl\n", folder.c_str());
        return 1;
    }
    std::printf("zen-lv2-ttl: %zu plug-ins in %zu layouts with %zu presets written to %s\n", files.size(),
                variants.size(), presets.size(), folder.c_str());
    return 0;
}
