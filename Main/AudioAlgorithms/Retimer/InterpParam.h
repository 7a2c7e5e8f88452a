// Settings of the re-timer's interpolator: the input rate factor (input
// samples consumed per output sample: 1 keeps the duration, the only value
// the real-time re-timer takes) and the output rate ratio (the rate at
// which the stretched stream is read: the pitch ratio).
#pragma once

#include "System/ParamGroup.h"

namespace ora::retimer::interp {

class Param : public ParamGroup {
public:
    float m_InputRate = 1.0f;
    float m_OutputRatio = 1.0f;

    // Output samples per input sample.
    double GetUpsamplerInvRate() const { return 1.0 / static_cast<double>(m_InputRate); }
};

}  // namespace ora::retimer::interp
