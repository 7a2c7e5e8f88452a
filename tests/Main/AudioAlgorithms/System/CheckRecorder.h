// Records the algorithm library's failed checks for the scope of a test.
#pragma once

#include <string>
#include <vector>

#include "System/Check.h"

namespace zentest {

class CheckRecorder {
public:
    CheckRecorder();
    ~CheckRecorder();
    CheckRecorder(const CheckRecorder&) = delete;
    CheckRecorder& operator=(const CheckRecorder&) = delete;

    // The conditions that failed, in order.
    const std::vector<std::string>& Checks() const;

private:
    ora::system::CheckHandler m_previous;
};

}  // namespace zentest
