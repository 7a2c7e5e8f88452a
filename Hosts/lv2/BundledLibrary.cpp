#include "BundledLibrary.h"

#include <dlfcn.h>

#include <string>
#include <vector>

namespace zenlv2 {

namespace {

std::string BundleFolder() {
    Dl_info info{};
    if (dladdr(reinterpret_cast<const void*>(&BundleFolder), &info) == 0 || info.dli_fname == nullptr) return {};
    const std::string path = info.dli_fname;
    const std::size_t slash = path.find_last_of('/');
    return slash == std::string::npos ? std::string(".") : path.substr(0, slash);
}

}  // namespace

Library& BundledLibrary() {
    static Library library = [] {
        const std::string folder = BundleFolder();
        return Library(std::vector<std::string>{folder + "/../../" ZEN_LV2_LIBRARY_FILE,
                                                folder + "/" ZEN_LV2_LIBRARY_FILE, ZEN_LV2_LIBRARY_FILE});
    }();
    return library;
}

const char* BundledLibraryFile() { return ZEN_LV2_LIBRARY_FILE; }

}  // namespace zenlv2
