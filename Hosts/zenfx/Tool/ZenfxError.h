// A user-facing failure: one line for stderr and the exit status.
#pragma once

#include <stdexcept>
#include <string>

namespace zenfx {

constexpr int kExitFailure = 1;
constexpr int kExitUsage = 2;

class ZenfxError : public std::runtime_error {
public:
    explicit ZenfxError(const std::string& message, int exitCode = kExitFailure)
        : std::runtime_error(message), m_exitCode(exitCode) {}
    int ExitCode() const { return m_exitCode; }

private:
    int m_exitCode;
};

}  // namespace zenfx
