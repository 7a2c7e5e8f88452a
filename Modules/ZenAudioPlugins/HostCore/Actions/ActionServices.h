// The zen::HostServices a host hands the library for one mixer channel or one
// slot of it: the channel index and session id an instance asks for at
// creation, and the action-call entry, answered from an action registry with
// the channel (and the slot's id, when given) as the caller's. One object per
// slot, so an action knows who called it.
#pragma once

#include <cstdint>

#include "ActionRegistry.h"
#include "zen/PluginTypes.h"

namespace zen::host {

class ActionServices {
public:
    ActionServices(const ActionRegistry& registry, std::int64_t channelIndex, std::int64_t sessionId,
                   std::uint64_t caller = 0);
    ActionServices(const ActionServices&) = delete;
    ActionServices& operator=(const ActionServices&) = delete;

    zen::HostServices* Services() { return &m_bridge; }
    std::int64_t ChannelIndex() const { return m_channelIndex; }

    // The action-call entry: runs `action` with the arguments and copies the
    // result (or the reason for a failure) into `result`, cut to
    // resultCapacity - 1 bytes and terminated. False for an unknown action,
    // a wrong argument count or a failed action.
    static bool CallAction(zen::HostServices* self, const char* action, const char* const* arguments,
                           std::uint32_t argumentCount, char* result, std::uint32_t resultCapacity);

private:
    struct Bridge : zen::HostServices {
        ActionServices* owner = nullptr;
    };

    static std::int64_t GetChannelIndex(zen::HostServices* self);
    static std::int64_t GetSessionId(zen::HostServices* self);

    Bridge m_bridge;
    const ActionRegistry& m_registry;
    std::int64_t m_channelIndex;
    std::int64_t m_sessionId;
    std::uint64_t m_caller;
};

}  // namespace zen::host
