// The reverb with its early and late paths at 1/4 of the host's rate
// (polyphase decimation and interpolation around them), for host rates of
// 176.4 and 192 kHz. Blocks must be a multiple of 4 frames.
#pragma once

#include "zn_reverb_u15.h"

namespace zen::reverb {

class zn_reverb_u15_x4 : public zn_reverb_u15 {
    Q_OBJECT

public:
    std::uint32_t Factor() const override { return 4; }
    bool Process(float* const* channels, std::uint64_t nsamples) override;
};

}  // namespace zen::reverb
