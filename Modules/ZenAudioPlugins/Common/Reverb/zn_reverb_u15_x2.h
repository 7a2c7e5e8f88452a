// The reverb with its early and late paths at 1/2 of the host's rate
// (polyphase decimation and interpolation around them), for host rates of
// 88.2 and 96 kHz. Blocks must be a multiple of 2 frames.
#pragma once

#include "zn_reverb_u15.h"

namespace zen::reverb {

class zn_reverb_u15_x2 : public zn_reverb_u15 {
    Q_OBJECT

public:
    std::uint32_t Factor() const override { return 2; }
    bool Process(float* const* channels, std::uint64_t nsamples) override;
};

}  // namespace zen::reverb
