// Realtime factors through the LV2 bundle, as a Linux host runs the plug-ins:
// every stereo plug-in of zen.lv2 with its default settings, 48 kHz,
// 512-frame blocks walked through a second of noise, each beside the same
// plug-in run directly on the same kind of input, so the pair shows what the
// adapter costs.
#include <lilv/lilv.h>

#include <algorithm>
#include <random>
#include <string>
#include <vector>

#include "Support/Realtime.h"

namespace {

void RunThroughLv2(benchmark::State& state, LilvWorld* world, const LilvPlugin* plugin) {
    LilvInstance* instance = lilv_plugin_instantiate(plugin, zenbench::kSampleRate, nullptr);
    if (instance == nullptr) {
        state.SkipWithError("the plug-in cannot be instantiated");
        return;
    }
    const std::uint32_t ports = lilv_plugin_get_num_ports(plugin);
    std::vector<float> minimum(ports), maximum(ports), defaults(ports);
    lilv_plugin_get_port_ranges_float(plugin, minimum.data(), maximum.data(), defaults.data());
    LilvNode* audioClass = lilv_new_uri(world, LILV_URI_AUDIO_PORT);
    LilvNode* inputClass = lilv_new_uri(world, LILV_URI_INPUT_PORT);
    std::vector<std::vector<float>> audio(ports);
    // A repeated block would be a periodic signal, which some plug-ins
    // process more cheaply than fresh input: every input port walks its own
    // second of noise.
    const std::size_t sourceFrames = static_cast<std::size_t>(zenbench::kSampleRate);
    std::vector<std::vector<float>> sources(ports);
    std::mt19937 random(7);
    std::uniform_real_distribution<float> noise(-1.0f, 1.0f);
    for (std::uint32_t p = 0; p < ports; ++p) {
        const LilvPort* port = lilv_plugin_get_port_by_index(plugin, p);
        if (lilv_port_is_a(plugin, port, audioClass)) {
            audio[p].resize(zenbench::kBlock);
            if (lilv_port_is_a(plugin, port, inputClass)) {
                sources[p].resize(sourceFrames);
                for (float& x : sources[p]) x = noise(random);
            }
            lilv_instance_connect_port(instance, p, audio[p].data());
        } else {
            lilv_instance_connect_port(instance, p, &defaults[p]);
        }
    }
    lilv_node_free(inputClass);
    lilv_node_free(audioClass);
    lilv_instance_activate(instance);
    std::size_t position = 0;
    // The copy of fresh input is timed too, as in the direct run.
    for (auto _ : state) {
        if (position + zenbench::kBlock > sourceFrames) position = 0;
        for (std::uint32_t p = 0; p < ports; ++p)
            if (!sources[p].empty()) std::copy_n(sources[p].begin() + position, zenbench::kBlock, audio[p].begin());
        position += zenbench::kBlock;
        lilv_instance_run(instance, zenbench::kBlock);
    }
    zenbench::ReportRealtime(state, zenbench::kBlock);
    lilv_instance_deactivate(instance);
    lilv_instance_free(instance);
}

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
                                     [world, plugin](benchmark::State& state) { RunThroughLv2(state, world, plugin); });
        benchmark::RegisterBenchmark(("BM_Lv2Direct/" + name).c_str(),
                                     [name](benchmark::State& state) { zenbench::RunPlugin(state, name, 2); });
    }
    return true;
}();

}  // namespace
