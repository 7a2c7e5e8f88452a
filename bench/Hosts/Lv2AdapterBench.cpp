// Realtime factors through the LV2 bundle, as a Linux host runs the plug-ins:
// every stereo plug-in of zen.lv2 with its default settings, 48 kHz,
// 512-frame blocks walked through a second of noise, each beside the same
// plug-in run directly on the same kind of input, so the pair shows what the
// adapter costs.
#include <lilv/lilv.h>

#include <string>

#include "Support/Lv2Run.h"
#include "Support/Realtime.h"

namespace {

// One benchmark per stereo plug-in the bundle offers; the world lives as
// long as the process.
const bool kRegistered = [] {
    LilvWorld* world = lilv_world_new();
    LilvNode* bundle = lilv_new_file_uri(world, nullptr, ZEN_LV2_BUNDLE "/");
    lilv_world_load_bundle(world, bundle);
    lilv_node_free(bundle);
    const LilvPlugins* plugins = lilv_world_get_all_plugins(world);
    LILV_FOREACH(plugins, i, plugins) {
        const LilvPlugin* plugin = lilv_plugins_get(plugins, i);
        const std::string uri = lilv_node_as_uri(lilv_plugin_get_uri(plugin));
        if (uri.size() < 7 || uri.compare(uri.size() - 7, 7, ":stereo") != 0) continue;
        LilvNode* label = lilv_plugin_get_name(plugin);
        std::string name = lilv_node_as_string(label);
        lilv_node_free(label);
        const std::size_t layout = name.rfind(" (Stereo)");
        if (layout != std::string::npos) name.erase(layout);
        benchmark::RegisterBenchmark(("BM_Lv2/" + name).c_str(),
                                     [world, plugin](benchmark::State& state) { zenbench::RunLv2(state, world, plugin); });
        benchmark::RegisterBenchmark(("BM_Lv2Direct/" + name).c_str(),
                                     [name](benchmark::State& state) { zenbench::RunPlugin(state, name, 2); });
    }
    return true;
}();

}  // namespace
