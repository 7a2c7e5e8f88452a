// A small LV2 host over lilv, as a Linux host sees our bundle: the world
// loads one bundle only, instances get a URID map and a block-length option,
// and every port is connected to a buffer of its own.
#pragma once

#include <lilv/lilv.h>
#include <lv2/options/options.h>
#include <lv2/urid/urid.h>
#include <lv2/worker/worker.h>

#include <cstdint>
#include <map>
#include <string>
#include <utility>
#include <vector>

#include "zen/ParameterInfo.h"

namespace zentest {

// A value at `fraction` of a parameter's range, on a step for switches and
// lists: the settings the LV2 tests give every plug-in.
float ParameterValueAt(const zen::ParameterInfo& info, float fraction);

struct Lv2Port {
    std::uint32_t index = 0;
    std::string symbol;
    std::string name;
    bool input = false;
    bool audio = false;
    std::string designation;  // full URI, or empty
    std::string groupClass;   // the port group's type for audio ports: full URI, or empty
    float minimum = 0.0f, maximum = 0.0f, defaultValue = 0.0f;
    bool hasRange = false;
    std::vector<std::string> properties;                 // full URIs
    std::vector<std::pair<float, std::string>> scalePoints;  // ordered by value
    bool Has(const char* propertyUri) const;
};

// A preset as a host reads it: label and port values by symbol.
struct Lv2Preset {
    std::string uri;
    std::string label;
    std::map<std::string, float> values;
};

class LilvHost {
public:
    static constexpr std::uint32_t kMaxBlock = 4096;

    explicit LilvHost(const std::string& bundleFolder);
    ~LilvHost();
    LilvHost(const LilvHost&) = delete;
    LilvHost& operator=(const LilvHost&) = delete;

    std::vector<std::string> PluginUris() const;
    const LilvPlugin* Find(const std::string& uri) const;
    std::string Name(const LilvPlugin* plugin) const;
    std::vector<Lv2Port> Ports(const LilvPlugin* plugin) const;
    std::vector<Lv2Preset> Presets(const LilvPlugin* plugin);
    const LV2_Feature* const* Features() const { return m_features.data(); }

    LV2_URID Map(const char* uri);
    LilvWorld* World() const { return m_world; }

private:
    static LV2_URID MapCallback(LV2_URID_Map_Handle handle, const char* uri);

    LilvWorld* m_world = nullptr;
    std::vector<std::string> m_uris;  // URID n is m_uris[n - 1]
    LV2_URID_Map m_map{};
    std::int32_t m_maxBlock = kMaxBlock;
    std::vector<LV2_Options_Option> m_options;
    LV2_Feature m_mapFeature{};
    LV2_Feature m_optionsFeature{};
    std::vector<const LV2_Feature*> m_features;
};

// An instance with a buffer behind every port: audio ports hold up to
// LilvHost::kMaxBlock * 3 frames, control ports one float. With `worker`, it
// also offers LV2's worker: work Run schedules waits for DoScheduledWork.
class LilvRun {
public:
    static constexpr std::uint32_t kMaxFrames = LilvHost::kMaxBlock * 3;

    LilvRun(LilvHost& host, const LilvPlugin* plugin, double sampleRate, bool worker = false);
    ~LilvRun();
    LilvRun(const LilvRun&) = delete;
    LilvRun& operator=(const LilvRun&) = delete;

    bool Ok() const { return m_instance != nullptr; }
    const std::vector<Lv2Port>& Ports() const { return m_ports; }
    float& Control(std::uint32_t port) { return m_controls[port]; }
    float& Control(const std::string& symbol);
    std::vector<float>& Audio(std::uint32_t port) { return m_audio[port]; }
    std::vector<std::uint32_t> AudioPorts(bool input) const;
    // Connects an audio port to another buffer (a host sharing buffers).
    void ConnectAudio(std::uint32_t port, float* data);

    void Activate();
    void Deactivate();
    void Run(std::uint32_t frames);
    // The work scheduled so far, done as a host's worker thread does it
    // between blocks; the number of requests.
    int DoScheduledWork();
    LilvInstance* Instance() { return m_instance; }

private:
    static LV2_Worker_Status Schedule(LV2_Worker_Schedule_Handle handle, std::uint32_t size, const void* data);

    std::vector<const LV2_Feature*> m_features;
    LV2_Worker_Schedule m_schedule{};
    LV2_Feature m_workerFeature{};
    int m_scheduled = 0;
    LilvInstance* m_instance = nullptr;
    bool m_active = false;
    std::vector<Lv2Port> m_ports;
    std::vector<float> m_controls;
    std::vector<std::vector<float>> m_audio;
};

}  // namespace zentest
