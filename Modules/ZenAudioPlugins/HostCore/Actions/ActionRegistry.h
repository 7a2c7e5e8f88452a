// Named host actions a plug-in may call: "LoadPlugin", "SetIntParameter",
// ... Each takes text arguments and answers a text result. A name nobody
// registered is a clean failure, never a crash.
//
// Register while setting the host up; Call from any thread afterwards (a
// shared lock guards the table, so Call is not for the audio thread).
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <map>
#include <shared_mutex>
#include <string>
#include <vector>

namespace zen::host {

struct ActionCall {
    std::string action;
    std::vector<std::string> arguments;
    std::int64_t channel = -1;  // the caller's mixer channel, -1 when unknown
    std::uint64_t caller = 0;   // the calling slot's host-given id, 0 when unknown
};

class ActionRegistry {
public:
    // Fills `result` and answers true, or answers false with the reason in
    // `result`. Handlers may throw HostError; the registry turns it into
    // false and its message.
    using Handler = std::function<bool(const ActionCall& call, std::string& result)>;

    // False, keeping the first, when the name is taken. The handler is called
    // only with minimumArguments..maximumArguments arguments.
    bool Register(const std::string& name, std::size_t minimumArguments, std::size_t maximumArguments, Handler handler);
    bool Unregister(const std::string& name);

    bool Contains(const std::string& name) const;
    std::vector<std::string> Names() const;

    // False with "unknown action 'X'" for a name nobody registered, and with
    // the expected count for a wrong number of arguments.
    bool Call(const ActionCall& call, std::string& result) const;

private:
    struct Entry {
        std::size_t minimumArguments;
        std::size_t maximumArguments;
        Handler handler;
    };
    mutable std::shared_mutex m_mutex;
    std::map<std::string, Entry> m_actions;
};

}  // namespace zen::host
