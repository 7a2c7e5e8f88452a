#include "StudioModel.h"

#include <strings.h>

#include <algorithm>
#include <cmath>
#include <sstream>

#include "HostCore/HostError.h"
#include "HostCore/Levelling/LevellerEngineAction.h"
#include "HostCore/Settings/SettingsDocument.h"

namespace zen::host {

namespace {

// A rate as people write it: 48000, 44100.5.
std::string Hertz(double rate) {
    std::ostringstream text;
    text.precision(12);
    text << rate;
    return text.str();
}

constexpr const char* kReferencePrefix = "zen:";  // how plug-ins name other plug-ins

std::size_t ParseIndex(const std::string& text, const char* what) {
    double value = 0.0;
    if (!ParseNumber(text, value) || value < 0 || std::floor(value) != value)
        throw HostError(std::string(what) + " '" + text + "' is not an index");
    return static_cast<std::size_t>(value);
}

std::int32_t FindParameter(zen::PluginInstance& instance, AudioPlugin& audio, const std::string& name) {
    auto* controls = zen::InterfaceCast<ZenControlValueHost>(&instance);
    std::int32_t index = controls != nullptr ? controls->FindParameter(name.c_str()) : -1;
    for (std::uint32_t i = 0; index < 0 && i < audio.GetParameterCount(); ++i) {
        zen::ParameterInfo info;
        if (audio.GetParameterInfo(i, info) && (strcasecmp(info.label.c_str(), name.c_str()) == 0 ||
                                                strcasecmp(info.identifier.c_str(), name.c_str()) == 0))
            index = static_cast<std::int32_t>(i);
    }
    if (index < 0) throw HostError(std::string("'") + instance.GetName() + "' has no parameter '" + name + "'");
    return index;
}

// "1 or 2", "1 to 32": the channel counts a plug-in takes (in = out).
std::string AcceptedCounts(AudioPlugin& audio, const zen::PluginDescriptor& d) {
    std::vector<std::uint32_t> counts;
    const std::uint32_t inputs = audio.GetInputChannelCount(), outputs = audio.GetOutputChannelCount();
    for (std::uint32_t n = 1; n <= std::max(d.inputChannelLimit, d.outputChannelLimit); ++n)
        if (audio.ConfigureChannels(d.inputChannelLimit == 0 ? 0 : n, n)) counts.push_back(n);
    audio.ConfigureChannels(inputs, outputs);
    if (counts.empty()) return "none of the same count in and out";
    if (counts.size() == 1) return std::to_string(counts[0]);
    if (counts.size() == 2) return std::to_string(counts[0]) + " or " + std::to_string(counts[1]);
    return std::to_string(counts.front()) + " to " + std::to_string(counts.back());
}

std::string Channels(std::uint32_t n) { return std::to_string(n) + (n == 1 ? " channel" : " channels"); }

}  // namespace

StudioModel::StudioModel(zen::PluginInterface& library, std::int64_t sessionId)
    : m_library(library), m_sessionId(sessionId) {
    RegisterActions();
}

StudioModel::~StudioModel() {
    // Instances may call actions while they go; the registry outlives them.
    m_channels.clear();
}

std::size_t StudioModel::AddChannel(const std::string& name, std::uint32_t audioChannels,
                                    std::uint32_t sourceChannels) {
    if (audioChannels < 1) throw HostError("channel '" + name + "' needs at least one audio channel");
    if (sourceChannels > audioChannels)
        throw HostError("channel '" + name + "' cannot narrow " + Channels(sourceChannels) + " to " +
                        std::to_string(audioChannels));
    auto channel = std::make_unique<Channel>();
    channel->name = name;
    channel->audioChannels = audioChannels;
    channel->sourceChannels = sourceChannels == 0 ? audioChannels : sourceChannels;
    channel->services =
        std::make_unique<ActionServices>(m_actions, static_cast<std::int64_t>(m_channels.size()), m_sessionId);
    m_channels.push_back(std::move(channel));
    return m_channels.size() - 1;
}

const StudioModel::Channel& StudioModel::GetChannel(std::size_t channel) const {
    if (channel >= m_channels.size()) throw HostError("there is no channel " + std::to_string(channel));
    return *m_channels[channel];
}

StudioModel::Channel& StudioModel::ChannelAt(std::size_t channel) {
    return const_cast<Channel&>(static_cast<const StudioModel*>(this)->GetChannel(channel));
}

StudioModel::Slot& StudioModel::SlotAt(std::size_t channel, std::size_t slot) {
    Channel& c = ChannelAt(channel);
    if (slot >= c.chain.size())
        throw HostError("channel '" + c.name + "' has no slot " + std::to_string(slot) + " (it has " +
                        std::to_string(c.chain.size()) + ")");
    return c.chain[slot];
}

AudioPlugin& StudioModel::PluginAt(std::size_t channel, std::size_t slot) { return *SlotAt(channel, slot).audio; }

std::string StudioModel::FindKey(const std::string& plugin) const {
    const std::string wanted =
        plugin.rfind(kReferencePrefix, 0) == 0 ? plugin.substr(std::string(kReferencePrefix).size()) : plugin;
    for (const auto& [key, entry] : m_library.GetPluginList(zen::kAudioPluginKind))
        if (strcasecmp(key.c_str(), wanted.c_str()) == 0 || strcasecmp(entry.name.c_str(), wanted.c_str()) == 0)
            return key;
    throw HostError("unknown plug-in '" + plugin + "'");
}

void StudioModel::Configure(const Channel& channel, Slot& slot, bool first) const {
    const zen::PluginDescriptor& d = *slot.instance->GetDescriptor();
    const std::uint32_t n = channel.audioChannels;
    const std::uint32_t in = d.inputChannelLimit == 0 ? 0 : (first ? channel.sourceChannels : n);
    if (!slot.audio->ConfigureChannels(in, n)) {
        if (in == 0 || in == n)
            throw HostError("'" + slot.name + "' does not accept " + Channels(n) + " (it takes " +
                            AcceptedCounts(*slot.audio, d) + ")");
        throw HostError("'" + slot.name + "' does not take " + Channels(in) + " in and " + std::to_string(n) +
                        " out");
    }
    if (m_prepared && !slot.audio->Prepare(static_cast<float>(m_sampleRate), m_maxBlock))
        throw HostError("'" + slot.name + "' cannot run at " + Hertz(m_sampleRate) + " Hz in blocks of " +
                        std::to_string(m_maxBlock));
}

std::size_t StudioModel::InsertPlugin(std::size_t channel, const std::string& plugin, std::size_t slot) {
    Channel& c = ChannelAt(channel);
    if (slot != kAppend && slot > c.chain.size())
        throw HostError("channel '" + c.name + "' has no slot " + std::to_string(slot));
    Slot s;
    s.key = FindKey(plugin);
    // The instance learns its channel from the services it is created with
    // and keeps them; the interface's own pointer must not outlive the model.
    m_library.SetHostServices(c.services->Services());
    s.instance.reset(m_library.CreatePlugin(zen::kAudioPluginKind, s.key));
    m_library.SetHostServices(nullptr);
    s.audio = zen::InterfaceCast<AudioPlugin>(s.instance.get());
    if (s.audio == nullptr || s.instance->GetDescriptor() == nullptr)
        throw HostError("the library could not create '" + plugin + "'");
    s.name = s.instance->GetName();
    const std::size_t at = slot == kAppend ? c.chain.size() : slot;
    Configure(c, s, at == 0);
    c.chain.insert(c.chain.begin() + static_cast<std::ptrdiff_t>(at), std::move(s));
    if (at == 0 && c.chain.size() > 1) ConfigureAll(c);
    return at;
}

void StudioModel::RemovePlugin(std::size_t channel, std::size_t slot) {
    SlotAt(channel, slot);
    Channel& c = ChannelAt(channel);
    c.chain.erase(c.chain.begin() + static_cast<std::ptrdiff_t>(slot));
    if (slot == 0) ConfigureAll(c);
}

void StudioModel::MovePlugin(std::size_t channel, std::size_t from, std::size_t to) {
    SlotAt(channel, from);
    SlotAt(channel, to);
    Channel& c = ChannelAt(channel);
    Slot moving = std::move(c.chain[from]);
    c.chain.erase(c.chain.begin() + static_cast<std::ptrdiff_t>(from));
    c.chain.insert(c.chain.begin() + static_cast<std::ptrdiff_t>(to), std::move(moving));
    if (from == 0 || to == 0) ConfigureAll(c);
}

void StudioModel::ConfigureAll(Channel& channel) {
    if (channel.sourceChannels == channel.audioChannels) return;  // every place has the same layout
    for (std::size_t i = 0; i < channel.chain.size(); ++i) Configure(channel, channel.chain[i], i == 0);
}

void StudioModel::SetBypass(std::size_t channel, std::size_t slot, bool bypassed) {
    SlotAt(channel, slot).audio->SetBypass(bypassed);
}

void StudioModel::Prepare(double sampleRate, std::uint32_t maxBlock) {
    m_prepared = false;
    m_sampleRate = sampleRate;
    m_maxBlock = maxBlock;
    for (auto& channel : m_channels)
        for (Slot& slot : channel->chain)
            if (!slot.audio->Prepare(static_cast<float>(sampleRate), maxBlock))
                throw HostError("'" + slot.name + "' cannot run at " + Hertz(sampleRate) +
                                " Hz in blocks of " + std::to_string(maxBlock));
    m_prepared = true;
}

bool StudioModel::Process(std::size_t channel, float* const* buffers, std::uint64_t frames) noexcept {
    if (!m_prepared || channel >= m_channels.size()) return false;
    bool ok = true;
    for (Slot& slot : m_channels[channel]->chain) ok = slot.audio->Process(buffers, frames) && ok;
    return ok;
}

void StudioModel::RunBackgroundTasks(std::size_t channel, bool inputEnded) {
    // A task may edit the chain through actions: walk a copy of the instances.
    std::vector<zen::BackgroundTask*> tasks;
    for (Slot& slot : ChannelAt(channel).chain)
        if (auto* task = zen::InterfaceCast<zen::BackgroundTask>(slot.instance.get())) tasks.push_back(task);
    for (zen::BackgroundTask* task : tasks) task->RunBackgroundTask(inputEnded);
}

std::uint64_t StudioModel::Latency(std::size_t channel) const {
    std::uint64_t total = 0;
    for (const Slot& slot : GetChannel(channel).chain) total += slot.audio->GetLatency();
    return total;
}

void StudioModel::RegisterActions() {
    auto callerChannel = [this](const ActionCall& call) -> std::size_t {
        if (call.channel < 0 || static_cast<std::size_t>(call.channel) >= m_channels.size())
            throw HostError("'" + call.action + "' needs the caller's channel");
        return static_cast<std::size_t>(call.channel);
    };
    // (plug-in, slot): inserts the plug-in at the slot of the caller's channel.
    m_actions.Register("LoadPlugin", 1, 2, [this, callerChannel](const ActionCall& call, std::string& result) {
        const std::size_t slot = call.arguments.size() > 1 ? ParseIndex(call.arguments[1], "slot") : kAppend;
        const std::size_t channel = callerChannel(call);
        result =
            std::to_string(InsertPlugin(channel, call.arguments[0], std::min(slot, ChannelAt(channel).chain.size())));
        return true;
    });
    // (slot, parameter, value in tenths): the decimal text of the value times ten.
    m_actions.Register("SetIntParameter", 3, 3, [this, callerChannel](const ActionCall& call, std::string&) {
        Slot& slot = SlotAt(callerChannel(call), ParseIndex(call.arguments[0], "slot"));
        double tenths = 0.0;
        if (!ParseNumber(call.arguments[2], tenths) || std::floor(tenths) != tenths)
            throw HostError("'" + call.arguments[2] + "' is not a whole number of tenths");
        const std::int32_t index = FindParameter(*slot.instance, *slot.audio, call.arguments[1]);
        return slot.audio->SetParameter(static_cast<std::uint32_t>(index), static_cast<float>(tenths / 10.0));
    });
    // (slot, parameter, value): the value in the parameter's unit.
    m_actions.Register("SetParameter", 3, 3, [this, callerChannel](const ActionCall& call, std::string&) {
        Slot& slot = SlotAt(callerChannel(call), ParseIndex(call.arguments[0], "slot"));
        double value = 0.0;
        if (!ParseNumber(call.arguments[2], value)) throw HostError("'" + call.arguments[2] + "' is not a number");
        const std::int32_t index = FindParameter(*slot.instance, *slot.audio, call.arguments[1]);
        return slot.audio->SetParameter(static_cast<std::uint32_t>(index), static_cast<float>(value));
    });
    // (slot, parameter): the current value.
    m_actions.Register("GetParameter", 2, 2, [this, callerChannel](const ActionCall& call, std::string& result) {
        Slot& slot = SlotAt(callerChannel(call), ParseIndex(call.arguments[0], "slot"));
        const std::int32_t index = FindParameter(*slot.instance, *slot.audio, call.arguments[1]);
        result = FormatNumber(slot.audio->GetParameter(static_cast<std::uint32_t>(index)));
        return true;
    });
    // (slot, 0 or 1)
    m_actions.Register("SetBypass", 2, 2, [this, callerChannel](const ActionCall& call, std::string&) {
        const std::size_t flag = ParseIndex(call.arguments[1], "bypass");
        if (flag > 1) throw HostError("bypass is 0 or 1");
        SetBypass(callerChannel(call), ParseIndex(call.arguments[0], "slot"), flag == 1);
        return true;
    });
    RegisterLevellerEngine(m_actions);
}

}  // namespace zen::host
