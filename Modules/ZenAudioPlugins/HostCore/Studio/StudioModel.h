// The host's studio: mixer channels, each an ordered chain of plug-in slots
// with bypass, built from a library's audio plug-ins through the public
// interface. It also answers the host actions a plug-in may call on its own
// channel ("LoadPlugin", "FindPlugin", "SetIntParameter", ...), through
// per-slot host services so that every action knows who called it.
//
// Threads: build and edit the model on one thread while no block runs;
// Process runs a channel's chain on the audio thread and is real-time safe.
// RunBackgroundTasks and the actions it leads to edit the model: they belong
// to the editing thread.
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
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
        std::uint64_t id = 0;  // unique in the model, kept when the slot moves
        // The instance's own services (they name it as the caller of its
        // actions); before the instance, so they outlive it.
        std::unique_ptr<ActionServices> services;
        std::unique_ptr<zen::PluginInstance> instance;
        AudioPlugin* audio = nullptr;
    };
    struct Channel {
        std::string name;
        std::uint32_t audioChannels = 2;
        // Inputs of the first slot: fewer than audioChannels when it widens
        // its source (mono to stereo); every later slot takes audioChannels.
        std::uint32_t sourceChannels = 2;
        // Actions from outside any slot ("LoadPlugin" appends).
        std::unique_ptr<ActionServices> services;
        std::vector<Slot> chain;  // not "slots": a toolkit keyword
    };

    // A chain action a plug-in asked for ("LoadPlugin", "SetIntParameter",
    // "SetParameter", "SetBypass"), with what it did.
    struct ActionRecord {
        std::size_t channel = 0;
        std::string action;
        std::vector<std::string> arguments;
        bool ok = false;
        std::string result;  // the answer, or the reason it failed
        std::string target;  // name of the plug-in acted on, or empty
        // A parameter set: its description and the value it holds now.
        bool parameterSet = false;
        zen::ParameterInfo parameter;
        float value = 0.0f;
        std::string note;  // "bypassed", "skipped: ...", or empty
    };

    explicit StudioModel(zen::PluginInterface& library, std::int64_t sessionId = 0);
    ~StudioModel();
    StudioModel(const StudioModel&) = delete;
    StudioModel& operator=(const StudioModel&) = delete;

    zen::PluginInterface& Library() { return m_library; }
    ActionRegistry& Actions() { return m_actions; }

    // Sees every chain action after it ran, on the thread that called it.
    void SetActionObserver(std::function<void(const ActionRecord&)> observer) { m_observer = std::move(observer); }
    // Takes the model's debug messages (a mapping it skipped); none when unset.
    void SetDebugOutput(std::function<void(const std::string&)> output) { m_debug = std::move(output); }

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
    // Registers a chain action whose calls reach the observer.
    void RegisterChainAction(const char* name, std::size_t minimumArguments, std::size_t maximumArguments,
                             std::function<bool(const ActionCall&, ActionRecord&)> handler);
    std::size_t CallerChannel(const ActionCall& call) const;
    // Index of the calling slot in its channel, or kAppend.
    std::size_t CallerSlot(const ActionCall& call) const;
    bool SetIntParameter(const ActionCall& call, ActionRecord& record);

    zen::PluginInterface& m_library;
    std::int64_t m_sessionId;
    ActionRegistry m_actions;
    std::vector<std::unique_ptr<Channel>> m_channels;
    bool m_prepared = false;
    double m_sampleRate = 48000.0;
    std::uint32_t m_maxBlock = 1024;
    std::uint64_t m_lastSlotId = 0;
    std::function<void(const ActionRecord&)> m_observer;
    std::function<void(const std::string&)> m_debug;
};

}  // namespace zen::host
