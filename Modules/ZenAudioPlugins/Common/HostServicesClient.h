// The library's side of zen::HostServices: every entry is read only when the
// size the host declared covers it, so hosts built against an older header
// (a shorter struct) keep working.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "zen/PluginTypes.h"

namespace zen {

class HostServicesClient {
public:
    // Room for a host action's answer, NUL included.
    static constexpr std::uint32_t kResultCapacity = 4096;

    explicit HostServicesClient(HostServices* services = nullptr) : m_services(services) {}

    HostServices* Services() const { return m_services; }

    // The host's answers, or `fallback` when it does not offer the entry.
    std::int64_t ChannelIndex(std::int64_t fallback) const;
    std::int64_t SessionId(std::int64_t fallback) const;

    // Runs a host action; false when there are no services, the host's
    // struct predates CallAction, the entry is null or the host says false.
    // `result`, when given, receives the answer (cleared on false). UI thread.
    bool CallAction(const char* action, const std::vector<std::string>& arguments, std::string* result) const;

private:
    // True when the host's struct reaches `end` bytes.
    bool Covers(std::size_t end) const;

    HostServices* m_services;
};

}  // namespace zen
