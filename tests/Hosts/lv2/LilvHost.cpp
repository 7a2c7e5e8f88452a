#include "LilvHost.h"

#include <lv2/atom/atom.h>
#include <lv2/buf-size/buf-size.h>
#include <lv2/port-groups/port-groups.h>
#include <lv2/presets/presets.h>

#include <algorithm>
#include <cmath>
#include <stdexcept>

namespace zentest {

namespace {

std::string AsString(const LilvNode* node) {
    if (node == nullptr) return {};
    return lilv_node_is_uri(node) ? lilv_node_as_uri(node) : lilv_node_as_string(node);
}

}  // namespace

float ParameterValueAt(const zen::ParameterInfo& info, float fraction) {
    if (info.kind == zen::ParameterKind::Switch) return fraction >= 0.5f ? 1.0f : 0.0f;
    if (info.kind == zen::ParameterKind::List && info.choices.size() > 1) {
        const auto last = static_cast<float>(info.choices.size() - 1);
        return info.minimum + std::round(fraction * last) * info.step;
    }
    return info.minimum + fraction * (info.maximum - info.minimum);
}

bool Lv2Port::Has(const char* propertyUri) const {
    return std::find(properties.begin(), properties.end(), propertyUri) != properties.end();
}

LilvHost::LilvHost(const std::string& bundleFolder) : m_world(lilv_world_new()) {
    m_map.handle = this;
    m_map.map = MapCallback;
    m_mapFeature = {LV2_URID__map, &m_map};
    const LV2_URID atomInt = Map(LV2_ATOM__Int);
    m_options.push_back({LV2_OPTIONS_INSTANCE, 0, Map(LV2_BUF_SIZE__maxBlockLength), sizeof(std::int32_t), atomInt,
                         &m_maxBlock});
    m_options.push_back({LV2_OPTIONS_INSTANCE, 0, 0, 0, 0, nullptr});
    m_optionsFeature = {LV2_OPTIONS__options, m_options.data()};
    m_features = {&m_mapFeature, &m_optionsFeature, nullptr};

    LilvNode* bundle = lilv_new_file_uri(m_world, nullptr, (bundleFolder + "/").c_str());
    lilv_world_load_bundle(m_world, bundle);
    lilv_node_free(bundle);
}

LilvHost::~LilvHost() { lilv_world_free(m_world); }

LV2_URID LilvHost::Map(const char* uri) {
    const auto found = std::find(m_uris.begin(), m_uris.end(), uri);
    if (found != m_uris.end()) return static_cast<LV2_URID>(found - m_uris.begin() + 1);
    m_uris.emplace_back(uri);
    return static_cast<LV2_URID>(m_uris.size());
}

LV2_URID LilvHost::MapCallback(LV2_URID_Map_Handle handle, const char* uri) {
    return static_cast<LilvHost*>(handle)->Map(uri);
}

std::vector<std::string> LilvHost::PluginUris() const {
    std::vector<std::string> uris;
    const LilvPlugins* plugins = lilv_world_get_all_plugins(m_world);
    LILV_FOREACH(plugins, i, plugins) uris.push_back(lilv_node_as_uri(lilv_plugin_get_uri(lilv_plugins_get(plugins, i))));
    return uris;
}

const LilvPlugin* LilvHost::Find(const std::string& uri) const {
    LilvNode* node = lilv_new_uri(m_world, uri.c_str());
    const LilvPlugin* plugin = lilv_plugins_get_by_uri(lilv_world_get_all_plugins(m_world), node);
    lilv_node_free(node);
    return plugin;
}

std::string LilvHost::Name(const LilvPlugin* plugin) const {
    LilvNode* name = lilv_plugin_get_name(plugin);
    const std::string text = AsString(name);
    lilv_node_free(name);
    return text;
}

std::vector<Lv2Port> LilvHost::Ports(const LilvPlugin* plugin) const {
    LilvNode* inputClass = lilv_new_uri(m_world, LILV_URI_INPUT_PORT);
    LilvNode* audioClass = lilv_new_uri(m_world, LILV_URI_AUDIO_PORT);
    LilvNode* designation = lilv_new_uri(m_world, LV2_CORE__designation);
    LilvNode* group = lilv_new_uri(m_world, LV2_PORT_GROUPS__group);
    LilvNode* type = lilv_new_uri(m_world, LILV_NS_RDF "type");
    std::vector<Lv2Port> ports;
    for (std::uint32_t p = 0; p < lilv_plugin_get_num_ports(plugin); ++p) {
        const LilvPort* port = lilv_plugin_get_port_by_index(plugin, p);
        Lv2Port info;
        info.index = p;
        info.symbol = AsString(lilv_port_get_symbol(plugin, port));
        LilvNode* name = lilv_port_get_name(plugin, port);
        info.name = AsString(name);
        lilv_node_free(name);
        info.input = lilv_port_is_a(plugin, port, inputClass);
        info.audio = lilv_port_is_a(plugin, port, audioClass);
        LilvNode* designated = lilv_port_get(plugin, port, designation);
        info.designation = AsString(designated);
        lilv_node_free(designated);
        if (LilvNode* owner = lilv_port_get(plugin, port, group)) {
            // The first type that is not one of the generic group classes.
            LilvNodes* types = lilv_world_find_nodes(m_world, owner, type, nullptr);
            LILV_FOREACH(nodes, i, types) {
                const std::string uri = AsString(lilv_nodes_get(types, i));
                if (uri != LV2_PORT_GROUPS__InputGroup && uri != LV2_PORT_GROUPS__OutputGroup && info.groupClass.empty())
                    info.groupClass = uri;
            }
            lilv_nodes_free(types);
            lilv_node_free(owner);
        }
        LilvNode *def = nullptr, *min = nullptr, *max = nullptr;
        lilv_port_get_range(plugin, port, &def, &min, &max);
        info.hasRange = min != nullptr && max != nullptr;
        if (def != nullptr) info.defaultValue = lilv_node_as_float(def);
        if (min != nullptr) info.minimum = lilv_node_as_float(min);
        if (max != nullptr) info.maximum = lilv_node_as_float(max);
        lilv_node_free(def);
        lilv_node_free(min);
        lilv_node_free(max);
        LilvNodes* properties = lilv_port_get_properties(plugin, port);
        LILV_FOREACH(nodes, i, properties) info.properties.push_back(AsString(lilv_nodes_get(properties, i)));
        lilv_nodes_free(properties);
        LilvScalePoints* points = lilv_port_get_scale_points(plugin, port);
        LILV_FOREACH(scale_points, i, points) {
            const LilvScalePoint* point = lilv_scale_points_get(points, i);
            info.scalePoints.emplace_back(lilv_node_as_float(lilv_scale_point_get_value(point)),
                                          AsString(lilv_scale_point_get_label(point)));
        }
        lilv_scale_points_free(points);
        std::sort(info.scalePoints.begin(), info.scalePoints.end());
        ports.push_back(std::move(info));
    }
    lilv_node_free(inputClass);
    lilv_node_free(audioClass);
    lilv_node_free(designation);
    lilv_node_free(group);
    lilv_node_free(type);
    return ports;
}

namespace {

void CollectValue(const char* symbol, void* user, const void* value, std::uint32_t size, std::uint32_t) {
    if (size == sizeof(float)) (*static_cast<std::map<std::string, float>*>(user))[symbol] = *static_cast<const float*>(value);
}

}  // namespace

std::vector<Lv2Preset> LilvHost::Presets(const LilvPlugin* plugin) {
    std::vector<Lv2Preset> presets;
    LilvNode* presetClass = lilv_new_uri(m_world, LV2_PRESETS__Preset);
    LilvNodes* related = lilv_plugin_get_related(plugin, presetClass);
    LILV_FOREACH(nodes, i, related) {
        const LilvNode* node = lilv_nodes_get(related, i);
        lilv_world_load_resource(m_world, node);
        LilvState* state = lilv_state_new_from_world(m_world, &m_map, node);
        if (state == nullptr) continue;
        Lv2Preset preset;
        preset.uri = AsString(node);
        if (const char* label = lilv_state_get_label(state)) preset.label = label;
        lilv_state_restore(state, nullptr, CollectValue, &preset.values, 0, nullptr);
        lilv_state_free(state);
        presets.push_back(std::move(preset));
    }
    lilv_nodes_free(related);
    lilv_node_free(presetClass);
    return presets;
}

LilvRun::LilvRun(LilvHost& host, const LilvPlugin* plugin, double sampleRate, bool worker)
    : m_ports(host.Ports(plugin)) {
    for (const LV2_Feature* const* feature = host.Features(); *feature != nullptr; ++feature)
        m_features.push_back(*feature);
    if (worker) {
        m_schedule = {this, &LilvRun::Schedule};
        m_workerFeature = {LV2_WORKER__schedule, &m_schedule};
        m_features.push_back(&m_workerFeature);
    }
    m_features.push_back(nullptr);
    m_instance = lilv_plugin_instantiate(plugin, sampleRate, m_features.data());
    m_controls.resize(m_ports.size());
    m_audio.resize(m_ports.size());
    if (m_instance == nullptr) return;
    for (const Lv2Port& port : m_ports) {
        m_controls[port.index] = port.defaultValue;
        if (port.audio) m_audio[port.index].assign(kMaxFrames, 0.0f);
        lilv_instance_connect_port(m_instance, port.index,
                                   port.audio ? static_cast<void*>(m_audio[port.index].data())
                                              : static_cast<void*>(&m_controls[port.index]));
    }
}

LilvRun::~LilvRun() {
    if (m_instance == nullptr) return;
    if (m_active) lilv_instance_deactivate(m_instance);
    lilv_instance_free(m_instance);
}

float& LilvRun::Control(const std::string& symbol) {
    for (const Lv2Port& port : m_ports)
        if (port.symbol == symbol) return m_controls[port.index];
    throw std::out_of_range("no port " + symbol);
}

std::vector<std::uint32_t> LilvRun::AudioPorts(bool input) const {
    std::vector<std::uint32_t> ports;
    for (const Lv2Port& port : m_ports)
        if (port.audio && port.input == input) ports.push_back(port.index);
    return ports;
}

void LilvRun::ConnectAudio(std::uint32_t port, float* data) { lilv_instance_connect_port(m_instance, port, data); }

void LilvRun::Activate() {
    lilv_instance_activate(m_instance);
    m_active = true;
}

void LilvRun::Deactivate() {
    lilv_instance_deactivate(m_instance);
    m_active = false;
}

void LilvRun::Run(std::uint32_t frames) { lilv_instance_run(m_instance, frames); }

LV2_Worker_Status LilvRun::Schedule(LV2_Worker_Schedule_Handle handle, std::uint32_t, const void*) {
    ++static_cast<LilvRun*>(handle)->m_scheduled;
    return LV2_WORKER_SUCCESS;
}

int LilvRun::DoScheduledWork() {
    const auto* worker =
        static_cast<const LV2_Worker_Interface*>(lilv_instance_get_extension_data(m_instance, LV2_WORKER__interface));
    const auto respond = [](LV2_Worker_Respond_Handle, std::uint32_t, const void*) { return LV2_WORKER_SUCCESS; };
    const int requests = m_scheduled;
    const char token = 0;
    for (; m_scheduled > 0; --m_scheduled)
        worker->work(lilv_instance_get_handle(m_instance), respond, nullptr, sizeof(token), &token);
    return requests;
}

}  // namespace zentest
