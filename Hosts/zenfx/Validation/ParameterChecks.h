// Parameter descriptions, set and get, indices out of range, extreme values
// while processing, and state save and restore.
#pragma once

#include "ValidationContext.h"

namespace zenfx {

class ParameterChecks {
public:
    explicit ParameterChecks(ValidationContext& context) : m_context(context) {}
    void Run();

private:
    CheckOutcome Descriptions();
    CheckOutcome SetAndGet();
    CheckOutcome IndicesOutOfRange();
    CheckOutcome ExtremesWhileProcessing();
    CheckOutcome StateRoundTrip();
    CheckOutcome Presets();

    // "'Gain' (index 1)".
    std::string Name(std::uint32_t index) const;

    ValidationContext& m_context;
};

}  // namespace zenfx
