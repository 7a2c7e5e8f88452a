// The bundle's UI binary: lv2ui_descriptor with one Qt 5 UI per plug-in and
// layout, each the plug-in's own editor over an Lv2EditorLink. It runs in a
// host that already has its QApplication (jalv.qt5, Qt 5 DAWs) and never
// makes one: without it the UI is refused.
#include <lv2/options/options.h>
#include <lv2/parameters/parameters.h>
#include <lv2/atom/atom.h>
#include <lv2/ui/ui.h>
#include <lv2/urid/urid.h>

#include <QApplication>
#include <QPointer>
#include <QWidget>
#include <cstdio>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "BundledLibrary.h"
#include "Catalog.h"
#include "Lv2EditorLink.h"
#include "PortMap.h"

namespace {

// What the link reports before the host says otherwise.
constexpr float kDefaultSampleRate = 48000.0f;

struct Offered {
    std::vector<zenlv2::Variant> variants;
    std::vector<std::string> uris;             // the UIs', by variant
    std::vector<LV2UI_Descriptor> descriptors;  // same order; never resized after the build
};

// One open UI. Members go in reverse: the editor, then its link, then the
// instance the link reads.
struct Ui {
    std::unique_ptr<zen::PluginInstance> instance;
    std::unique_ptr<zenlv2::Lv2EditorLink> link;
    QPointer<QWidget> editor;  // the host may have deleted it with its window
    ~Ui() { delete editor.data(); }
};

// The host's rate from the options feature, where it gives one.
float SampleRate(const LV2_Feature* const* features) {
    const LV2_URID_Map* map = nullptr;
    const LV2_Options_Option* options = nullptr;
    for (int i = 0; features != nullptr && features[i] != nullptr; ++i) {
        if (std::strcmp(features[i]->URI, LV2_URID__map) == 0)
            map = static_cast<const LV2_URID_Map*>(features[i]->data);
        else if (std::strcmp(features[i]->URI, LV2_OPTIONS__options) == 0)
            options = static_cast<const LV2_Options_Option*>(features[i]->data);
    }
    if (map == nullptr || options == nullptr) return kDefaultSampleRate;
    const LV2_URID rate = map->map(map->handle, LV2_PARAMETERS__sampleRate);
    const LV2_URID atomFloat = map->map(map->handle, LV2_ATOM__Float);
    for (const LV2_Options_Option* o = options; o->key != 0; ++o)
        if (o->key == rate && o->type == atomFloat && o->size == sizeof(float) && o->value != nullptr)
            return *static_cast<const float*>(o->value);
    return kDefaultSampleRate;
}

LV2UI_Handle Instantiate(const LV2UI_Descriptor* descriptor, const char* pluginUri, const char*,
                         LV2UI_Write_Function write, LV2UI_Controller controller, LV2UI_Widget* widget,
                         const LV2_Feature* const* features);

void Cleanup(LV2UI_Handle handle) { delete static_cast<Ui*>(handle); }

void PortEvent(LV2UI_Handle handle, uint32_t port, uint32_t size, uint32_t protocol, const void* buffer) {
    if (protocol != 0 || size != sizeof(float) || buffer == nullptr) return;
    static_cast<Ui*>(handle)->link->PortEvent(port, *static_cast<const float*>(buffer));
}

const void* ExtensionData(const char*) { return nullptr; }

const Offered& TheOffered() {
    static const Offered offered = [] {
        Offered built;
        zenlv2::Library& library = zenlv2::BundledLibrary();
        if (!library.IsLoaded()) {
            std::fprintf(stderr, "zen.lv2 UI: cannot load %s: %s\n", zenlv2::BundledLibraryFile(),
                         library.Error().c_str());
            return built;
        }
        try {
            built.variants = zenlv2::Catalog::Build(library);
            for (const zenlv2::Variant& variant : built.variants) built.uris.push_back(zenlv2::Catalog::UiUri(variant));
            for (const std::string& uri : built.uris)
                built.descriptors.push_back({uri.c_str(), Instantiate, Cleanup, PortEvent, ExtensionData});
        } catch (...) {  // out of memory: the host sees no UI
            built = Offered{};
        }
        return built;
    }();
    return offered;
}

LV2UI_Handle Instantiate(const LV2UI_Descriptor* descriptor, const char* pluginUri, const char*,
                         LV2UI_Write_Function write, LV2UI_Controller controller, LV2UI_Widget* widget,
                         const LV2_Feature* const* features) {
    const Offered& offered = TheOffered();
    const auto index = static_cast<std::size_t>(descriptor - offered.descriptors.data());
    if (index >= offered.variants.size() || widget == nullptr) return nullptr;
    const zenlv2::Variant& variant = offered.variants[index];
    if (pluginUri != nullptr && variant.uri != pluginUri) return nullptr;
    if (QApplication::instance() == nullptr) {
        std::fprintf(stderr, "zen.lv2 UI: '%s' needs a Qt 5 host (no QApplication)\n", variant.name.c_str());
        return nullptr;
    }
    try {
        auto ui = std::make_unique<Ui>();
        ui->instance = zenlv2::BundledLibrary().Create(variant.key);
        auto* audio = zen::InterfaceCast<AudioPlugin>(ui->instance.get());
        if (audio == nullptr || !audio->ConfigureChannels(variant.inputs, variant.outputs)) return nullptr;
        const zenlv2::PortMap ports(*audio, variant.inputs, variant.outputs);
        ui->link = std::make_unique<zenlv2::Lv2EditorLink>(*audio, ports, write, controller, SampleRate(features));
        ui->editor = static_cast<QWidget*>(audio->CreateEditorFor(*ui->link, nullptr));
        if (ui->editor.isNull()) {
            std::fprintf(stderr, "zen.lv2 UI: '%s' has no editor\n", variant.name.c_str());
            return nullptr;
        }
        *widget = ui->editor.data();
        return ui.release();
    } catch (...) {  // failures reach the host as no UI
        return nullptr;
    }
}

}  // namespace

extern "C" LV2_SYMBOL_EXPORT const LV2UI_Descriptor* lv2ui_descriptor(uint32_t index) {
    const Offered& offered = TheOffered();
    return index < offered.descriptors.size() ? &offered.descriptors[index] : nullptr;
}
