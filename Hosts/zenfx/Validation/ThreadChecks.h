// Parameter changes, bypass switches and read-outs from a second thread while
// the first processes. Under ThreadSanitizer this is where races show.
#pragma once

#include "ValidationContext.h"

namespace zenfx {

class ThreadChecks {
public:
    explicit ThreadChecks(ValidationContext& context) : m_context(context) {}
    void Run();

private:
    CheckOutcome ParametersDuringProcessing();

    ValidationContext& m_context;
};

}  // namespace zenfx
