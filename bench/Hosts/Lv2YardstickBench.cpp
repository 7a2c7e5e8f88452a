// Open multiband compressors, where Debian's packages of them are installed
// (calf-plugins, lsp-plugins-lv2; never a dependency of the project), run
// through lilv at their defaults beside our own at its defaults: the
// yardsticks for the Multiband Compressor's speed. Without them, nothing is
// registered.
#include <lilv/lilv.h>

#include <string>

#include "Support/Lv2Run.h"
#include "Support/Realtime.h"

namespace {

const char* const kYardsticks[][2] = {
    {"Calf Multiband Compressor", "http://calf.sourceforge.net/plugins/MultibandCompressor"},
    {"LSP Multiband Compressor Stereo", "http://lsp-plug.in/plugins/lv2/mb_compressor_stereo"},
};

const bool kRegistered = [] {
    LilvWorld* world = lilv_world_new();
    lilv_world_load_all(world);
    const LilvPlugins* plugins = lilv_world_get_all_plugins(world);
    for (const auto& [name, uri] : kYardsticks) {
        LilvNode* node = lilv_new_uri(world, uri);
        const LilvPlugin* plugin = lilv_plugins_get_by_uri(plugins, node);
        lilv_node_free(node);
        if (plugin == nullptr) continue;
        benchmark::RegisterBenchmark((std::string("BM_Yardstick/") + name).c_str(),
                                     [world, plugin](benchmark::State& state) { zenbench::RunLv2(state, world, plugin); });
    }
    return true;
}();

}  // namespace
