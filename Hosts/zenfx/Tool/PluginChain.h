// Audio plug-ins run one after another over the same channel buffers.
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include <nlohmann/json.hpp>

#include "PluginLibrary.h"

namespace zenfx {

class PluginChain {
public:
    struct Stage {
        PluginEntry plugin;
        std::unique_ptr<zen::PluginInstance> instance;
        AudioPlugin* audio = nullptr;
    };

    // Appends an instance of the plug-in named by display name or key.
    Stage& Add(PluginLibrary& library, const std::string& nameOrKey);

    // Every stage takes `channels` in and out. Throws ZenfxError naming the
    // plug-in that refuses and the counts it takes.
    void ConfigureChannels(std::uint32_t channels);

    // "PARAM=VALUE" in the parameter's unit; throws ZenfxError.
    static void ApplySetting(Stage& stage, const std::string& assignment);
    static void ApplyPreset(Stage& stage, const std::string& preset);

    // Throws ZenfxError when a plug-in cannot be prepared.
    void Prepare(int sampleRate, std::uint32_t maxBlock);

    // Sum of the stages' latencies, in samples.
    std::uint64_t Latency() const;

    void Process(float* const* channels, std::uint64_t frames);

    // Every stage's meters: [{name, key, meters: [{identifier, name, unit,
    // kind, value}]}] (see ReadMeter).
    nlohmann::json MetersJson() const;

    const std::vector<Stage>& Stages() const { return m_stages; }
    std::vector<Stage>& Stages() { return m_stages; }
    std::string Names() const;  // "Soft Clipper -> Limiter"

private:
    std::vector<Stage> m_stages;
};

}  // namespace zenfx
