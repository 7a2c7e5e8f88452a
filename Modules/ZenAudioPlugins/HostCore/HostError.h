// A failure the host core reports to a user: one line that names the place
// (a file and line, a setting, a plug-in) and what is wrong there.
#pragma once

#include <stdexcept>
#include <string>

namespace zen::host {

class HostError : public std::runtime_error {
public:
    explicit HostError(const std::string& message) : std::runtime_error(message) {}
};

}  // namespace zen::host
