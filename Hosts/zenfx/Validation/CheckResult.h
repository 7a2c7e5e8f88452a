// What one validation check found.
#pragma once

#include <stdexcept>
#include <string>

namespace zenfx {

enum class CheckStatus { Pass, Fail, Skip };

inline const char* StatusName(CheckStatus status) {
    switch (status) {
        case CheckStatus::Pass: return "pass";
        case CheckStatus::Fail: return "fail";
        case CheckStatus::Skip: return "skip";
    }
    return "fail";
}

struct CheckOutcome {
    CheckStatus status = CheckStatus::Pass;
    std::string reason;  // what was checked, or what went wrong
};

inline CheckOutcome Pass(std::string reason) { return {CheckStatus::Pass, std::move(reason)}; }
inline CheckOutcome Fail(std::string reason) { return {CheckStatus::Fail, std::move(reason)}; }
inline CheckOutcome Skip(std::string reason) { return {CheckStatus::Skip, std::move(reason)}; }

struct CheckResult {
    std::string id;  // "group.name": "latency.impulse"
    CheckOutcome outcome;
};

// Thrown inside a check to end it as failed with this reason.
class CheckFailure : public std::runtime_error {
public:
    explicit CheckFailure(const std::string& reason) : std::runtime_error(reason) {}
};

// Ends the running check as failed unless `condition` holds.
inline void Require(bool condition, const std::string& reason) {
    if (!condition) throw CheckFailure(reason);
}

}  // namespace zenfx
