// The bundle's binary: lv2_descriptor and the LV2 callbacks over Instance.
// The plug-in library is found relative to the bundle (installed side by side
// under the same lib folder, or beside the binary), else on the system path.
#include <dlfcn.h>

#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

#include "Catalog.h"
#include "Instance.h"
#include "Library.h"

namespace {

std::string BundleFolder() {
    Dl_info info{};
    if (dladdr(reinterpret_cast<const void*>(&BundleFolder), &info) == 0 || info.dli_fname == nullptr) return {};
    const std::string path = info.dli_fname;
    const std::size_t slash = path.find_last_of('/');
    return slash == std::string::npos ? std::string(".") : path.substr(0, slash);
}

zenlv2::Library& TheLibrary() {
    static zenlv2::Library library = [] {
        const std::string folder = BundleFolder();
        return zenlv2::Library(
            std::vector<std::string>{folder + "/../../" ZEN_LV2_LIBRARY_FILE, folder + "/" ZEN_LV2_LIBRARY_FILE,
                                     ZEN_LV2_LIBRARY_FILE});
    }();
    return library;
}

struct Offered {
    std::vector<zenlv2::Variant> variants;
    std::vector<LV2_Descriptor> descriptors;  // same order; never resized after the build
};

LV2_Handle Instantiate(const LV2_Descriptor* descriptor, double sampleRate, const char*,
                       const LV2_Feature* const* features);
void ConnectPort(LV2_Handle handle, uint32_t port, void* data) {
    static_cast<zenlv2::Instance*>(handle)->ConnectPort(port, data);
}
void Activate(LV2_Handle handle) { static_cast<zenlv2::Instance*>(handle)->Activate(); }
void Run(LV2_Handle handle, uint32_t frames) { static_cast<zenlv2::Instance*>(handle)->Run(frames); }
void Deactivate(LV2_Handle) {}
void Cleanup(LV2_Handle handle) { delete static_cast<zenlv2::Instance*>(handle); }

LV2_State_Status Save(LV2_Handle handle, LV2_State_Store_Function store, LV2_State_Handle state, uint32_t,
                      const LV2_Feature* const*) {
    return static_cast<zenlv2::Instance*>(handle)->Save(store, state);
}
LV2_State_Status Restore(LV2_Handle handle, LV2_State_Retrieve_Function retrieve, LV2_State_Handle state, uint32_t,
                         const LV2_Feature* const*) {
    return static_cast<zenlv2::Instance*>(handle)->Restore(retrieve, state);
}

const void* ExtensionData(const char* uri) {
    static const LV2_State_Interface state = {Save, Restore};
    return std::strcmp(uri, LV2_STATE__interface) == 0 ? &state : nullptr;
}

const Offered& TheOffered() {
    static const Offered offered = [] {
        Offered built;
        zenlv2::Library& library = TheLibrary();
        if (!library.IsLoaded()) {
            std::fprintf(stderr, "zen.lv2: cannot load %s: %s\n", ZEN_LV2_LIBRARY_FILE, library.Error().c_str());
            return built;
        }
        try {
            built.variants = zenlv2::Catalog::Build(library);
            for (const zenlv2::Variant& variant : built.variants)
                built.descriptors.push_back(
                    {variant.uri.c_str(), Instantiate, ConnectPort, Activate, Run, Deactivate, Cleanup, ExtensionData});
        } catch (...) {  // out of memory: the host sees no plug-ins
            built = Offered{};
        }
        return built;
    }();
    return offered;
}

LV2_Handle Instantiate(const LV2_Descriptor* descriptor, double sampleRate, const char*,
                       const LV2_Feature* const* features) {
    const Offered& offered = TheOffered();
    const auto index = static_cast<std::size_t>(descriptor - offered.descriptors.data());
    if (index >= offered.variants.size()) return nullptr;
    try {
        return zenlv2::Instance::Create(TheLibrary(), offered.variants[index], sampleRate, features).release();
    } catch (...) {  // failures reach the host as no instance
        return nullptr;
    }
}

}  // namespace

extern "C" LV2_SYMBOL_EXPORT const LV2_Descriptor* lv2_descriptor(uint32_t index) {
    const Offered& offered = TheOffered();
    return index < offered.descriptors.size() ? &offered.descriptors[index] : nullptr;
}
