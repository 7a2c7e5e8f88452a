// Settings of the late reverberation: the network and its output stage.
#pragma once

#include "zn_reverberant_u15_core_param.h"
#include "zn_reverberant_u16_out_param.h"

namespace zen::reverb {

struct zn_reverberant_u15_param {
    explicit zn_reverberant_u15_param(std::uint32_t channels = 1) : out(channels) {}

    zn_reverberant_u15_core_param core;
    zn_reverberant_u16_out_param out;
};

}  // namespace zen::reverb
