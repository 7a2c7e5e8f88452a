// The bundle's binary: lv2_descriptor and the LV2 callbacks over Instance.
// The plug-in library is found relative to the bundle (installed side by side
// under the same lib folder, or beside the binary), else on the system path.
#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

#include "BundledLibrary.h"
#include "Catalog.h"
#include "Instance.h"

namespace {

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

LV2_Worker_Status Work(LV2_Handle handle, LV2_Worker_Respond_Function, LV2_Worker_Respond_Handle, uint32_t,
                       const void*) {
    static_cast<zenlv2::Instance*>(handle)->Work();
    return LV2_WORKER_SUCCESS;
}
LV2_Worker_Status WorkResponse(LV2_Handle, uint32_t, const void*) { return LV2_WORKER_SUCCESS; }

const void* ExtensionData(const char* uri) {
    static const LV2_State_Interface state = {Save, Restore};
    static const LV2_Worker_Interface worker = {Work, WorkResponse, nullptr};
    if (std::strcmp(uri, LV2_STATE__interface) == 0) return &state;
    if (std::strcmp(uri, LV2_WORKER__interface) == 0) return &worker;
    return nullptr;
}

const Offered& TheOffered() {
    static const Offered offered = [] {
        Offered built;
        zenlv2::Library& library = zenlv2::BundledLibrary();
        if (!library.IsLoaded()) {
            std::fprintf(stderr, "zen.lv2: cannot load %s: %s\n", zenlv2::BundledLibraryFile(),
                         library.Error().c_str());
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
        return zenlv2::Instance::Create(zenlv2::BundledLibrary(), offered.variants[index], sampleRate, features).release();
    } catch (...) {  // failures reach the host as no instance
        return nullptr;
    }
}

}  // namespace

extern "C" LV2_SYMBOL_EXPORT const LV2_Descriptor* lv2_descriptor(uint32_t index) {
    const Offered& offered = TheOffered();
    return index < offered.descriptors.size() ? &offered.descriptors[index] : nullptr;
}
