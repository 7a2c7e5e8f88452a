// Creation and destruction, channel layouts, preparation at every rate,
// processing before preparation, and Reset.
#pragma once

#include "ValidationContext.h"

namespace zenfx {

class LifecycleChecks {
public:
    // The rates every plug-in must prepare for and run at.
    static constexpr double kRates[] = {22050.0, 44100.0, 48000.0, 88200.0, 96000.0, 176400.0, 192000.0};

    explicit LifecycleChecks(ValidationContext& context) : m_context(context) {}
    void Run();

private:
    CheckOutcome CreateDestroy();
    CheckOutcome ProcessBeforePrepare();
    CheckOutcome ChannelLayouts();
    CheckOutcome SampleRates();
    CheckOutcome PrepareLimits();
    CheckOutcome ResetReproduces();

    ValidationContext& m_context;
};

}  // namespace zenfx
