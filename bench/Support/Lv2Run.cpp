#include "Support/Lv2Run.h"

#include <lv2/atom/atom.h>
#include <lv2/urid/urid.h>

#include <algorithm>
#include <cmath>
#include <map>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include "Support/Realtime.h"

namespace zenbench {

namespace {

// URIDs handed out in order of first request.
struct UridMap {
    std::map<std::string, LV2_URID> ids;
    static LV2_URID Map(LV2_URID_Map_Handle handle, const char* uri) {
        auto& ids = static_cast<UridMap*>(handle)->ids;
        return ids.emplace(uri, static_cast<LV2_URID>(ids.size() + 1)).first->second;
    }
};

constexpr std::size_t kAtomCapacity = 8192;

}  // namespace

void RunLv2(benchmark::State& state, LilvWorld* world, const LilvPlugin* plugin) {
    UridMap urids;
    LV2_URID_Map map{&urids, &UridMap::Map};
    const LV2_Feature mapFeature{LV2_URID__map, &map};
    const LV2_Feature* features[] = {&mapFeature, nullptr};
    LilvInstance* instance = lilv_plugin_instantiate(plugin, kSampleRate, features);
    if (instance == nullptr) {
        state.SkipWithError("the plug-in cannot be instantiated");
        return;
    }
    const std::uint32_t ports = lilv_plugin_get_num_ports(plugin);
    std::vector<float> minimum(ports), maximum(ports), defaults(ports);
    lilv_plugin_get_port_ranges_float(plugin, minimum.data(), maximum.data(), defaults.data());
    LilvNode* audioClass = lilv_new_uri(world, LILV_URI_AUDIO_PORT);
    LilvNode* atomClass = lilv_new_uri(world, LV2_ATOM__AtomPort);
    LilvNode* controlClass = lilv_new_uri(world, LILV_URI_CONTROL_PORT);
    LilvNode* inputClass = lilv_new_uri(world, LILV_URI_INPUT_PORT);
    std::vector<std::vector<float>> audio(ports);
    // A repeated block would be a periodic signal, which some plug-ins
    // process more cheaply than fresh input: every input port walks its own
    // second of noise.
    const auto sourceFrames = static_cast<std::size_t>(kSampleRate);
    std::vector<std::vector<float>> sources(ports);
    std::vector<std::unique_ptr<LV2_Atom_Sequence[]>> atoms(ports);
    std::vector<bool> atomInput(ports, false);
    std::mt19937 random(7);
    std::uniform_real_distribution<float> noise(-1.0f, 1.0f);
    for (std::uint32_t p = 0; p < ports; ++p) {
        const LilvPort* port = lilv_plugin_get_port_by_index(plugin, p);
        const bool input = lilv_port_is_a(plugin, port, inputClass);
        if (lilv_port_is_a(plugin, port, atomClass)) {
            atoms[p].reset(new LV2_Atom_Sequence[kAtomCapacity / sizeof(LV2_Atom_Sequence)]);
            atomInput[p] = input;
            lilv_instance_connect_port(instance, p, atoms[p].get());
        } else if (lilv_port_is_a(plugin, port, controlClass)) {
            if (std::isnan(defaults[p])) defaults[p] = std::isnan(minimum[p]) ? 0.0f : minimum[p];
            lilv_instance_connect_port(instance, p, &defaults[p]);
        } else {
            // Audio, and any other signal port, gets a block of its own.
            audio[p].assign(kBlock, 0.0f);
            if (input && lilv_port_is_a(plugin, port, audioClass)) {
                sources[p].resize(sourceFrames);
                for (float& x : sources[p]) x = noise(random);
            }
            lilv_instance_connect_port(instance, p, audio[p].data());
        }
    }
    for (LilvNode* node : {audioClass, atomClass, controlClass, inputClass}) lilv_node_free(node);
    const LV2_URID sequenceType = UridMap::Map(&urids, LV2_ATOM__Sequence);
    const LV2_URID chunkType = UridMap::Map(&urids, LV2_ATOM__Chunk);
    lilv_instance_activate(instance);
    std::size_t position = 0;
    // The copy of fresh input is timed too, as in a direct run.
    for (auto _ : state) {
        if (position + kBlock > sourceFrames) position = 0;
        for (std::uint32_t p = 0; p < ports; ++p) {
            if (!sources[p].empty()) std::copy_n(sources[p].begin() + position, kBlock, audio[p].begin());
            if (atoms[p]) {  // an empty sequence in, room for one out
                atoms[p][0].atom.type = atomInput[p] ? sequenceType : chunkType;
                atoms[p][0].atom.size = atomInput[p] ? sizeof(LV2_Atom_Sequence_Body)
                                                     : static_cast<std::uint32_t>(kAtomCapacity - sizeof(LV2_Atom));
                atoms[p][0].body.unit = 0;
                atoms[p][0].body.pad = 0;
            }
        }
        position += kBlock;
        lilv_instance_run(instance, kBlock);
    }
    ReportRealtime(state, kBlock);
    lilv_instance_deactivate(instance);
    lilv_instance_free(instance);
}

}  // namespace zenbench
