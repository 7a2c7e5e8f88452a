#include "HostServicesClient.h"

#include <cstddef>

namespace zen {

namespace {

constexpr std::size_t kHeaderEnd = offsetof(HostServices, version) + sizeof(HostServices::version);
constexpr std::size_t kChannelIndexEnd =
    offsetof(HostServices, GetChannelIndex) + sizeof(HostServices::GetChannelIndex);
constexpr std::size_t kSessionIdEnd = offsetof(HostServices, GetSessionId) + sizeof(HostServices::GetSessionId);
constexpr std::size_t kCallActionEnd = offsetof(HostServices, CallAction) + sizeof(HostServices::CallAction);

}  // namespace

bool HostServicesClient::Covers(std::size_t end) const {
    return m_services != nullptr && m_services->structSize >= kHeaderEnd && m_services->structSize >= end;
}

std::int64_t HostServicesClient::ChannelIndex(std::int64_t fallback) const {
    if (!Covers(kChannelIndexEnd) || m_services->GetChannelIndex == nullptr) return fallback;
    return m_services->GetChannelIndex(m_services);
}

std::int64_t HostServicesClient::SessionId(std::int64_t fallback) const {
    if (!Covers(kSessionIdEnd) || m_services->GetSessionId == nullptr) return fallback;
    return m_services->GetSessionId(m_services);
}

bool HostServicesClient::CallAction(const char* action, const std::vector<std::string>& arguments,
                                    std::string* result) const {
    if (result != nullptr) result->clear();
    if (action == nullptr || !Covers(kCallActionEnd) || m_services->CallAction == nullptr) return false;
    std::vector<const char*> pointers;
    pointers.reserve(arguments.size());
    for (const std::string& argument : arguments) pointers.push_back(argument.c_str());
    std::vector<char> answer(kResultCapacity, '\0');
    const bool done = m_services->CallAction(m_services, action, pointers.data(),
                                             static_cast<std::uint32_t>(pointers.size()), answer.data(),
                                             kResultCapacity);
    if (!done) return false;
    answer.back() = '\0';  // a host that filled the whole buffer still leaves us a string
    if (result != nullptr) result->assign(answer.data());
    return true;
}

}  // namespace zen
