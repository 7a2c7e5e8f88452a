// The host's studio: mixer channels, each an ordered chain of plug-in slots
// with bypass, built from a library's audio plug-ins through the public
// interface. It also answers the host actions a plug-in may call on its own
// channel ("LoadPlugin", "SetIntParameter", ...), through per-channel
// host services so that every action knows whose channel it acts on.
//
// Threads: build and edit the model on one thread while no block runs;
// Process runs a channel's chain on the audio thread and is real-time safe.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "HostCore/Actions/ActionRegistry.h"
#include "HostCore/Actions/ActionServices.h"
#include "zen/Zen.h"

namespace zen::host {

class StudioModel {
public:
    static constexpr std::size_t kAppend = static_cast<std::size_t>(-1);

    struct Slot {
        std::string key;   // registry key, "Limiter:1517177970"
        std::string name;  // display name
        std::unique_ptr<zen::PluginInstance> instance;
        AudioPlugin* audio = nullptr;
    };
    struct Channel {
        std::string name;
        std::uint32_t audioChannels = 2;
        // Inputs of the first slot: fewer than audioChannels when it widens
        // its source (mono to stereo); every later slot takes audioChannels.
        std::uint32_t sourceChannels = 2;
        // Before the chain, so it outlives the instances that hold it.
        std::unique_ptr<ActionServices> services;
        std::vector<Slot> chain;  // not "slots": a toolkit keyword
    };

    explicit StudioModel(zen::PluginInterface& library, std::int64_t sessionId = 0);
    ~StudioModel();
    StudioModel(const StudioModel&) = delete;
    StudioModel& operator=(const StudioModel&) = delete;

    zen::PluginInterface& Library() { return m_library; }
    ActionRegistry& Actions() { return m_actions; }

    // `sourceChannels` 0: as many as `audioChannels`.
    std::size_t AddChannel(const std::string& name, std::uint32_t audioChannels, std::uint32_t sourceChannels = 0);
    std::size_t ChannelCount() const { return m_channels.size(); }
    const Channel& GetChannel(std::size_t channel) const;

    // The audio plug-in by key, "zen:" and key, or display name (any case),
    // inserted before `slot` (kAppend: at the end), in the channel's layout
    // and prepared when the model is. Throws HostError naming the plug-in
    // and the reason (for a layout, the channel counts it takes). Returns
    // the slot's index.
    std::size_t InsertPlugin(std::size_t channel, const std::string& plugin, std::size_t slot = kAppend);
    void RemovePlugin(std::size_t channel, std::size_t slot);
    void MovePlugin(std::size_t channel, std::size_t from, std::size_t to);
    void SetBypass(std::size_t channel, std::size_t slot, bool bypassed);
    AudioPlugin& PluginAt(std::size_t channel, std::size_t slot);

    // Prepares every slot; throws HostError naming a plug-in that refuses.
    void Prepare(double sampleRate, std::uint32_t maxBlock);
    bool IsPrepared() const { return m_prepared; }
    // Runs the channel's chain in place, bypassed slots included (they pass
    // the signal delayed by their latency). False when not prepared.
    bool Process(std::size_t channel, float* const* buffers, std::uint64_t frames) noexcept;
    // Runs the background task of every slot of the channel that has one, on
    // the calling (non-audio) thread. Slots a task inserts meanwhile wait for
    // the next call.
    void RunBackgroundTasks(std::size_t channel, bool inputEnded);
    // Sum of the chain's latencies, in samples.
    std::uint64_t Latency(std::size_t channel) const;

private:
    Channel& ChannelAt(std::size_t channel);
    Slot& SlotAt(std::size_t channel, std::size_t slot);
    std::string FindKey(const std::string& plugin) const;
    void Configure(const Channel& channel, Slot& slot, bool first) const;
    // After the first slot changed: each slot in its place's layout again.
    void ConfigureAll(Channel& channel);
    void RegisterActions();

    zen::PluginInterface& m_library;
    std::int64_t m_sessionId;
    ActionRegistry m_actions;
    std::vector<std::unique_ptr<Channel>> m_channels;
    bool m_prepared = false;
    double m_sampleRate = 48000.0;
    std::uint32_t m_maxBlock = 1024;
};

}  // namespace zen::host
