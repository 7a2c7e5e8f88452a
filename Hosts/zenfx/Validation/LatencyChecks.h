// The reported latency against the delay of an impulse through the neutral
// setting, and bypass keeping that latency.
#pragma once

#include "ValidationContext.h"

namespace zenfx {

class LatencyChecks {
public:
    explicit LatencyChecks(ValidationContext& context) : m_context(context) {}
    void Run();

private:
    CheckOutcome ImpulseDelay();
    CheckOutcome BypassKeepsLatency();

    ValidationContext& m_context;
};

}  // namespace zenfx
