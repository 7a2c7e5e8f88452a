// A host for the "AI" plug-in's tests: a channel of plug-in identifiers, the
// host actions the plug-in calls (recorded in order), and a levelling engine
// the test answers for.
#pragma once

#include <algorithm>
#include <cstdio>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "zen/Zen.h"

namespace zentest {

struct FakeHost : zen::HostServices {
    struct Call {
        std::string action;
        std::vector<std::string> arguments;
    };
    std::vector<Call> calls;
    std::vector<std::string> chain;  // identifiers of the channel's other plug-ins, by slot
    // Answers "AudioLevellerEngine"; null answers "".
    std::function<std::string(const std::vector<std::string>&)> engine;

    FakeHost() : zen::HostServices{sizeof(zen::HostServices), zen::kHostServicesVersion, nullptr, nullptr, &Dispatch} {}

    std::unique_ptr<zen::PluginInstance> Create(const std::string& key) {
        zen::PluginInterface* library = GetZenPluginInterface();
        library->SetHostServices(this);
        std::unique_ptr<zen::PluginInstance> instance(library->CreatePlugin(zen::kAudioPluginKind, key));
        library->SetHostServices(nullptr);
        return instance;
    }

    // The calls of one action, in order.
    std::vector<std::vector<std::string>> CallsOf(const std::string& action) const {
        std::vector<std::vector<std::string>> found;
        for (const Call& c : calls)
            if (c.action == action) found.push_back(c.arguments);
        return found;
    }

    static bool Dispatch(zen::HostServices* self, const char* action, const char* const* arguments,
                         std::uint32_t count, char* result, std::uint32_t capacity) {
        auto& host = *static_cast<FakeHost*>(self);
        Call call{action, std::vector<std::string>(arguments, arguments + count)};
        host.calls.push_back(call);
        std::string answer;
        if (call.action == "FindPlugin") {
            const auto it = std::find(host.chain.begin(), host.chain.end(), call.arguments.at(0));
            if (it != host.chain.end()) answer = std::to_string(it - host.chain.begin());
        } else if (call.action == "LoadPlugin") {
            host.chain.push_back(call.arguments.at(0));
            answer = std::to_string(host.chain.size() - 1);
        } else if (call.action == "AudioLevellerEngine" && host.engine) {
            answer = host.engine(call.arguments);
        }
        if (capacity > 0) std::snprintf(result, capacity, "%s", answer.c_str());
        return true;
    }
};

}  // namespace zentest
