// Settings of the modulated tap network: the plain settings, a modulation
// depth per tap (samples), the lines' limits, and the modulation's period and
// the cross-fade step used when the tap set changes.
#pragma once

#include "zn_reflections_param.h"

namespace zen::reverb {

struct zn_reflections_mod_param : zn_reflections_param {
    struct DelayLines {
        static constexpr std::uint32_t MaxLength = 32000;  // samples
        static constexpr std::uint32_t MinLength = 1;
        static constexpr float MaxDepth = 20.0f;  // samples
    };

    explicit zn_reflections_mod_param(std::uint32_t inputCount = 1)
        : zn_reflections_param(inputCount), depths(kTaps, 0.0f) {}

    ublas::vector<float> depths;  // samples, one per tap, 0..MaxDepth
    // The slowest tap's modulation period. Periods of about a second keep the
    // pitch deviation of sub-sample depths far below a cent.
    float periodMs = 1000.0f;
    // Per sample: a new tap set replaces the old one over 512 samples.
    float crossfadeStep = 0.001953125f;
};

}  // namespace zen::reverb
