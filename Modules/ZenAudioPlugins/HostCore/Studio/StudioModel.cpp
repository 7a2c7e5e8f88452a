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
// The host bypass of any plug-in, as templates name it.
constexpr const char* kInternalBypass = "Internal Bypass";
constexpr const char* kAfterCaller = "after";
constexpr double kTenths = 10.0;    // "SetIntParameter" integers carry tenths
constexpr double kPerMille = 1000.0;  // a whole control, in PerMille integers' values

std::size_t ParseIndex(const std::string& text, const char* what) {
    double value = 0.0;
    if (!ParseNumber(text, value) || value < 0 || std::floor(value) != value)
        throw HostError(std::string(what) + " '" + text + "' is not an index");
    return static_cast<std::size_t>(value);
}

// -1 when the plug-in has no such parameter.
std::int32_t LookUpParameter(zen::PluginInstance& instance, AudioPlugin& audio, const std::string& name) {
    auto* controls = zen::InterfaceCast<ZenControlValueHost>(&instance);
    std::int32_t index = controls != nullptr ? controls->FindParameter(name.c_str()) : -1;
    for (std::uint32_t i = 0; index < 0 && i < audio.GetParameterCount(); ++i) {
        zen::ParameterInfo info;
        if (audio.GetParameterInfo(i, info) && (strcasecmp(info.label.c_str(), name.c_str()) == 0 ||
                                                strcasecmp(info.identifier.c_str(), name.c_str()) == 0))
            index = static_cast<std::int32_t>(i);
    }
    return index;
}

std::string NoParameter(zen::PluginInstance& instance, const std::string& name) {
    return std::string("'") + instance.GetName() + "' has no parameter '" + name + "'";
}

std::int32_t FindParameter(zen::PluginInstance& instance, AudioPlugin& audio, const std::string& name) {
    const std::int32_t index = LookUpParameter(instance, audio, name);
    if (index < 0) throw HostError(NoParameter(instance, name));
    return index;
}

// Whole tenths as "SetIntParameter" sends them, signed.
double ParseTenths(const std::string& text) {
    double tenths = 0.0;
    if (!ParseNumber(text, tenths) || std::floor(tenths) != tenths)
        throw HostError("'" + text + "' is not a whole number of tenths");
    return tenths;
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
    s.id = ++m_lastSlotId;
    s.services = std::make_unique<ActionServices>(m_actions, static_cast<std::int64_t>(channel), m_sessionId, s.id);
    // The instance learns its channel from the services it is created with
    // and keeps them; the interface's own pointer must not outlive the model.
    m_library.SetHostServices(s.services->Services());
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

std::size_t StudioModel::CallerChannel(const ActionCall& call) const {
    if (call.channel < 0 || static_cast<std::size_t>(call.channel) >= m_channels.size())
        throw HostError("'" + call.action + "' needs the caller's channel");
    return static_cast<std::size_t>(call.channel);
}

std::size_t StudioModel::CallerSlot(const ActionCall& call) const {
    const auto& chain = m_channels[CallerChannel(call)]->chain;
    for (std::size_t i = 0; call.caller != 0 && i < chain.size(); ++i)
        if (chain[i].id == call.caller) return i;
    return kAppend;
}

void StudioModel::RegisterChainAction(const char* name, std::size_t minimumArguments, std::size_t maximumArguments,
                                      std::function<bool(const ActionCall&, ActionRecord&)> handler) {
    m_actions.Register(name, minimumArguments, maximumArguments,
                       [this, handler](const ActionCall& call, std::string& result) {
                           ActionRecord record;
                           record.channel = static_cast<std::size_t>(std::max<std::int64_t>(call.channel, 0));
                           record.action = call.action;
                           record.arguments = call.arguments;
                           try {
                               record.ok = handler(call, record);
                           } catch (const HostError& e) {
                               record.result = e.what();
                               if (m_observer) m_observer(record);
                               throw;
                           }
                           result = record.result;
                           if (m_observer) m_observer(record);
                           return record.ok;
                       });
}

bool StudioModel::SetIntParameter(const ActionCall& call, ActionRecord& record) {
    Slot& slot = SlotAt(CallerChannel(call), ParseIndex(call.arguments[0], "slot"));
    const std::string& name = call.arguments[1];
    const double value = ParseTenths(call.arguments[2]) / kTenths;
    record.target = slot.name;
    if (strcasecmp(name.c_str(), kInternalBypass) == 0) {
        slot.audio->SetBypass(value != 0.0);
        record.note = value != 0.0 ? "bypassed" : "in";
        return true;
    }
    const std::int32_t index = LookUpParameter(*slot.instance, *slot.audio, name);
    if (index < 0) {
        // A template may name a parameter this plug-in lacks: nothing to set.
        record.note = "skipped: " + NoParameter(*slot.instance, name);
        if (m_debug) m_debug(record.note);
        return true;
    }
    const auto i = static_cast<std::uint32_t>(index);
    zen::ParameterInfo& info = record.parameter;
    if (!slot.audio->GetParameterInfo(i, info)) throw HostError(NoParameter(*slot.instance, name));
    bool set = false;
    if (info.hostScale == zen::HostScale::PerMille) {
        auto* controls = zen::InterfaceCast<ZenControlValueHost>(slot.instance.get());
        if (controls == nullptr) throw HostError("'" + slot.name + "' has no control positions");
        set = controls->SetParameterPosition(i, static_cast<float>(std::clamp(value / kPerMille, 0.0, 1.0)));
    } else {
        set = slot.audio->SetParameter(
            i, static_cast<float>(std::clamp(value, static_cast<double>(info.minimum), static_cast<double>(info.maximum))));
    }
    record.parameterSet = set;
    record.value = slot.audio->GetParameter(i);
    if (!set) record.result = "'" + slot.name + "' refused " + info.label + " " + FormatNumber(value);
    return set;
}

void StudioModel::RegisterActions() {
    // (plug-in, slot): inserts the plug-in into the caller's channel at the
    // slot; with no slot or "after", right after the calling plug-in.
    RegisterChainAction("LoadPlugin", 1, 2, [this](const ActionCall& call, ActionRecord& record) {
        const std::size_t channel = CallerChannel(call);
        const std::size_t size = ChannelAt(channel).chain.size();
        std::size_t slot = kAppend;
        if (call.arguments.size() < 2 || call.arguments[1] == kAfterCaller) {
            const std::size_t caller = CallerSlot(call);
            slot = caller == kAppend ? kAppend : caller + 1;
        } else {
            slot = std::min(ParseIndex(call.arguments[1], "slot"), size);
        }
        const std::size_t at = InsertPlugin(channel, call.arguments[0], slot);
        record.target = ChannelAt(channel).chain[at].name;
        record.result = std::to_string(at);
        return true;
    });
    // (identifier): the slot of the caller's channel holding that plug-in,
    // matched on the whole "zen:Name:code", key or name; "" when none.
    m_actions.Register("FindPlugin", 1, 1, [this](const ActionCall& call, std::string& result) {
        const std::string& wanted = call.arguments[0];
        const auto& chain = ChannelAt(CallerChannel(call)).chain;
        for (std::size_t i = 0; i < chain.size(); ++i) {
            const std::string reference = kReferencePrefix + chain[i].key;
            if (strcasecmp(reference.c_str(), wanted.c_str()) == 0 ||
                strcasecmp(chain[i].key.c_str(), wanted.c_str()) == 0 ||
                strcasecmp(chain[i].name.c_str(), wanted.c_str()) == 0) {
                result = std::to_string(i);
                return true;
            }
        }
        result.clear();
        return true;
    });
    // (slot, parameter, value in tenths): the signed decimal of the value
    // times ten, read through the parameter's host scale. "Internal Bypass"
    // is the slot's bypass (nonzero: bypassed); a parameter the plug-in lacks
    // is skipped.
    RegisterChainAction("SetIntParameter", 3, 3,
                        [this](const ActionCall& call, ActionRecord& record) { return SetIntParameter(call, record); });
    // (slot, parameter, value): the value in the parameter's unit.
    RegisterChainAction("SetParameter", 3, 3, [this](const ActionCall& call, ActionRecord& record) {
        Slot& slot = SlotAt(CallerChannel(call), ParseIndex(call.arguments[0], "slot"));
        double value = 0.0;
        if (!ParseNumber(call.arguments[2], value)) throw HostError("'" + call.arguments[2] + "' is not a number");
        const auto index = static_cast<std::uint32_t>(FindParameter(*slot.instance, *slot.audio, call.arguments[1]));
        record.target = slot.name;
        record.parameterSet = slot.audio->SetParameter(index, static_cast<float>(value));
        slot.audio->GetParameterInfo(index, record.parameter);
        record.value = slot.audio->GetParameter(index);
        return record.parameterSet;
    });
    // (slot, parameter): the current value.
    m_actions.Register("GetParameter", 2, 2, [this](const ActionCall& call, std::string& result) {
        Slot& slot = SlotAt(CallerChannel(call), ParseIndex(call.arguments[0], "slot"));
        const std::int32_t index = FindParameter(*slot.instance, *slot.audio, call.arguments[1]);
        result = FormatNumber(slot.audio->GetParameter(static_cast<std::uint32_t>(index)));
        return true;
    });
    // (slot, 0 or 1)
    RegisterChainAction("SetBypass", 2, 2, [this](const ActionCall& call, ActionRecord& record) {
        const std::size_t flag = ParseIndex(call.arguments[1], "bypass");
        if (flag > 1) throw HostError("bypass is 0 or 1");
        const std::size_t slot = ParseIndex(call.arguments[0], "slot");
        SetBypass(CallerChannel(call), slot, flag == 1);
        record.target = SlotAt(CallerChannel(call), slot).name;
        record.note = flag == 1 ? "bypassed" : "in";
        return true;
    });
    RegisterLevellerEngine(m_actions);
}

}  // namespace zen::host
