#include "LevellerEngineAction.h"

#include <cmath>

#include "HostCore/HostError.h"
#include "HostCore/Settings/SettingsDocument.h"

namespace zen::host {

namespace {

using levelling::kBlockEntries;

constexpr std::size_t kMostArguments = 1 + 1 + kBlockEntries;  // "Process" FIRST V0..V9

double Number(const ActionCall& call, std::size_t argument) {
    double value = 0.0;
    if (!ParseNumber(call.arguments[argument], value))
        throw HostError("'" + call.arguments[argument] + "' is not a number");
    return value;
}

std::int64_t Whole(const ActionCall& call, std::size_t argument) {
    const double value = Number(call, argument);
    if (std::floor(value) != value) throw HostError("'" + call.arguments[argument] + "' is not a whole number");
    return static_cast<std::int64_t>(value);
}

void Expect(const ActionCall& call, std::size_t count) {
    if (call.arguments.size() != count)
        throw HostError("'" + call.arguments[0] + "' takes " + std::to_string(count - 1) + " arguments");
}

std::string Text(const LevellingEngine::Records& records) {
    std::string text;
    for (const levelling::EntryRecord& r : records) {
        for (const std::int32_t v : {r.gain, r.input, r.output, r.speech}) {
            if (!text.empty()) text += ' ';
            text += std::to_string(v);
        }
    }
    return text;
}

}  // namespace

LevellingEngine& LevellerEngineAction::Engine(std::int64_t channel) {
    std::unique_ptr<LevellingEngine>& engine = m_engines[channel];
    if (!engine) engine = std::make_unique<LevellingEngine>();
    return *engine;
}

bool LevellerEngineAction::Call(const ActionCall& call, std::string& result) {
    if (call.channel < 0) throw HostError("'" + call.action + "' needs the caller's channel");
    const std::lock_guard<std::mutex> lock(m_mutex);
    LevellingEngine& engine = Engine(call.channel);
    LevellingSettings& settings = engine.Settings();
    const std::string& command = call.arguments[0];
    result.clear();
    double index = 0.0;
    if (ParseNumber(command, index)) {
        Expect(call, 2);
        // Indexes past the table, and the plug-in's own 33 and 34, are ignored.
        if (index >= 0 && std::floor(index) == index && index < levelling::kParameterCount)
            settings.Set(static_cast<std::uint32_t>(index), static_cast<float>(Number(call, 1)));
    } else if (command == "Process") {
        Expect(call, kMostArguments);
        LevellingEngine::Inputs values{};
        for (std::size_t i = 0; i < kBlockEntries; ++i) values[i] = static_cast<float>(Number(call, 2 + i));
        result = Text(engine.Process(Whole(call, 1), values));
    } else if (command == "Finish") {
        Expect(call, 2);
        result = Text(engine.Finish(Whole(call, 1)));
    } else if (command == "Reset") {
        Expect(call, 1);
        engine.Reset();
    } else if (command == "Mode") {
        Expect(call, 2);
        if (!settings.SetMode(static_cast<int>(Whole(call, 1))))
            throw HostError("levelling mode '" + call.arguments[1] + "' is not 0 to 3");
    } else if (command == "SetRangePoint") {
        Expect(call, 4);
        const std::int64_t point = Whole(call, 1);
        if (point < 0 || !settings.SetRangePoint(static_cast<std::uint32_t>(point), static_cast<float>(Number(call, 2)),
                                                 static_cast<float>(Number(call, 3))))
            throw HostError("range point '" + call.arguments[1] + "' is not 0 to 3");
    } else if (command == "NormaliseSetAdvancedParameters") {
        Expect(call, 4);
        settings.SetClipAdvanced(static_cast<float>(Number(call, 1)), static_cast<float>(Number(call, 2)),
                                 static_cast<float>(Number(call, 3)));
    } else if (command == "NormaliseClips") {
        Expect(call, 4);
        settings.SetNormaliseClips(Number(call, 1) > 0.0, static_cast<float>(Number(call, 2)),
                                   static_cast<float>(Number(call, 3)));
    } else {
        throw HostError("'" + command + "' is not a command of '" + call.action + "'");
    }
    return true;
}

void RegisterLevellerEngine(ActionRegistry& actions) {
    auto engines = std::make_shared<LevellerEngineAction>();
    actions.Register(levelling::kEngineAction, 1, kMostArguments,
                     [engines](const ActionCall& call, std::string& result) { return engines->Call(call, result); });
}

}  // namespace zen::host
