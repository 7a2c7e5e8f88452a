#include "ActionRegistry.h"

#include <mutex>

#include "HostCore/HostError.h"

namespace zen::host {

bool ActionRegistry::Register(const std::string& name, std::size_t minimumArguments, std::size_t maximumArguments,
                              Handler handler) {
    if (name.empty() || !handler || minimumArguments > maximumArguments) return false;
    std::unique_lock lock(m_mutex);
    return m_actions.emplace(name, Entry{minimumArguments, maximumArguments, std::move(handler)}).second;
}

bool ActionRegistry::Unregister(const std::string& name) {
    std::unique_lock lock(m_mutex);
    return m_actions.erase(name) != 0;
}

bool ActionRegistry::Contains(const std::string& name) const {
    std::shared_lock lock(m_mutex);
    return m_actions.count(name) != 0;
}

std::vector<std::string> ActionRegistry::Names() const {
    std::shared_lock lock(m_mutex);
    std::vector<std::string> names;
    for (const auto& [name, entry] : m_actions) names.push_back(name);
    return names;
}

bool ActionRegistry::Call(const ActionCall& call, std::string& result) const {
    Handler handler;
    {
        std::shared_lock lock(m_mutex);
        const auto it = m_actions.find(call.action);
        if (it == m_actions.end()) {
            result = "unknown action '" + call.action + "'";
            return false;
        }
        const Entry& entry = it->second;
        const std::size_t count = call.arguments.size();
        if (count < entry.minimumArguments || count > entry.maximumArguments) {
            const std::string expected =
                entry.minimumArguments == entry.maximumArguments
                    ? std::to_string(entry.minimumArguments)
                    : std::to_string(entry.minimumArguments) + " to " + std::to_string(entry.maximumArguments);
            result = "'" + call.action + "' takes " + expected + " argument" +
                     (entry.maximumArguments == 1 ? "" : "s") + ", not " + std::to_string(count);
            return false;
        }
        handler = entry.handler;  // a copy, so the handler may register actions itself
    }
    result.clear();
    try {
        return handler(call, result);
    } catch (const HostError& e) {
        result = e.what();
        return false;
    }
}

}  // namespace zen::host
