#include "ActionServices.h"

#include <algorithm>
#include <cstring>

namespace zen::host {

ActionServices::ActionServices(const ActionRegistry& registry, std::int64_t channelIndex, std::int64_t sessionId,
                               std::uint64_t caller)
    : m_registry(registry), m_channelIndex(channelIndex), m_sessionId(sessionId), m_caller(caller) {
    m_bridge.owner = this;
    m_bridge.structSize = sizeof(zen::HostServices);
    m_bridge.version = zen::kHostServicesVersion;
    m_bridge.GetChannelIndex = &ActionServices::GetChannelIndex;
    m_bridge.GetSessionId = &ActionServices::GetSessionId;
    m_bridge.CallAction = &ActionServices::CallAction;
}

std::int64_t ActionServices::GetChannelIndex(zen::HostServices* self) {
    return static_cast<Bridge*>(self)->owner->m_channelIndex;
}

std::int64_t ActionServices::GetSessionId(zen::HostServices* self) {
    return static_cast<Bridge*>(self)->owner->m_sessionId;
}

bool ActionServices::CallAction(zen::HostServices* self, const char* action, const char* const* arguments,
                                std::uint32_t argumentCount, char* result, std::uint32_t resultCapacity) {
    std::string text;
    bool ok = false;
    if (self == nullptr || action == nullptr || (arguments == nullptr && argumentCount != 0)) {
        text = "malformed action call";
    } else {
        const ActionServices& owner = *static_cast<Bridge*>(self)->owner;
        ActionCall call{action, {}, owner.m_channelIndex, owner.m_caller};
        for (std::uint32_t i = 0; i < argumentCount; ++i) call.arguments.emplace_back(arguments[i] ? arguments[i] : "");
        try {
            ok = owner.m_registry.Call(call, text);
        } catch (const std::exception& e) {  // nothing may unwind into the plug-in
            text = e.what();
            ok = false;
        }
    }
    if (result != nullptr && resultCapacity > 0) {
        const std::size_t n = std::min<std::size_t>(text.size(), resultCapacity - 1);
        std::memcpy(result, text.data(), n);
        result[n] = '\0';
    }
    return ok;
}

}  // namespace zen::host
