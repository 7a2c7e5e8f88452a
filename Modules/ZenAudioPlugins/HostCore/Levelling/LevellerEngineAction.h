// The host action "AudioLevellerEngine": a levelling engine per caller's
// channel, driven by the text commands of zen/LevellerEngine.h. Answers of
// "Process" and "Finish" are ten "GAIN IN OUT SPEECH" records, space
// separated; the other commands answer "". Calls may come from any thread
// but the audio thread; one lock serialises them.
#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <mutex>
#include <string>

#include "HostCore/Actions/ActionRegistry.h"
#include "LevellingEngine.h"

namespace zen::host {

class LevellerEngineAction {
public:
    // Throws HostError for a command it does not know or bad numbers.
    bool Call(const ActionCall& call, std::string& result);

    // The channel's engine, made on first use.
    LevellingEngine& Engine(std::int64_t channel);

private:
    std::mutex m_mutex;
    std::map<std::int64_t, std::unique_ptr<LevellingEngine>> m_engines;
};

// Registers "AudioLevellerEngine" on `actions`, with engines of its own.
void RegisterLevellerEngine(ActionRegistry& actions);

}  // namespace zen::host
