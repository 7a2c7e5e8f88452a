// Drives an audio plug-in of the library through its host interface, as a
// host does: create by name, configure, prepare, process planar buffers.
#pragma once

#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "zen/Zen.h"

namespace zentest {

using Channels = std::vector<std::vector<float>>;

class PluginHarness {
public:
    // Creates the registered plug-in with this display name; fails the test
    // (fatally) when there is none.
    explicit PluginHarness(const std::string& name);

    AudioPlugin& Audio() { return *m_audio; }
    zen::PluginInstance& Instance() { return *m_instance; }

    // Configures channels in = out (no inputs for a plug-in without audio
    // input) and prepares; both must succeed.
    void Prepare(std::uint32_t channels, float sampleRate = 48000.0f, std::uint32_t maxBlock = 512);

    void Set(const std::string& labelOrIdentifier, float value);
    float Get(const std::string& labelOrIdentifier);

    // Processes all channels in place in blocks of `block` frames (0: one block).
    void Process(Channels& channels, std::size_t block = 0);
    // A copy of `input` on every channel, processed; returns the channels.
    Channels Run(const std::vector<float>& input, std::uint32_t channels = 1, std::size_t block = 0);

    // Processes `channels` in place in blocks of `block`, making `changes`
    // (label or identifier, value) before frame `at`.
    void ProcessSwitched(Channels& channels, std::size_t at,
                         const std::vector<std::pair<std::string, float>>& changes, std::size_t block = 512);

    float Meter(const std::string& name);
    // The values of an array meter.
    std::vector<float> MeterArray(const std::string& name);

private:
    std::unique_ptr<zen::PluginInstance> m_instance;
    AudioPlugin* m_audio = nullptr;
};

// The plug-in named `name` with `settings` (label or identifier, value) made
// before Prepare, so no smoothing ramp runs.
PluginHarness Prepared(const std::string& name, const std::vector<std::pair<std::string, float>>& settings,
                       std::uint32_t channels = 1, float sampleRate = 48000.0f, std::uint32_t maxBlock = 512);

// Every registered audio plug-in key of the library under test.
std::vector<std::string> RegisteredAudioKeys();

}  // namespace zentest
