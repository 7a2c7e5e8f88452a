// No heap allocation, free or lock inside Process: over a workload of its
// own (block lengths, parameter changes and bypass switches between blocks,
// resets, non-finite input, other layouts and rates) and over every Process
// call the other checks made. Runs last.
#pragma once

#include "ValidationContext.h"

namespace zenfx {

class RealtimeChecks {
public:
    explicit RealtimeChecks(ValidationContext& context) : m_context(context) {}
    void Run();

private:
    void Exercise();
    CheckOutcome Allocations();
    CheckOutcome Locks();

    ValidationContext& m_context;
};

}  // namespace zenfx
