// Everything the reverb's processing object needs, handed to it whole: the
// late reverberation, the reflection taps, the direct and early gain
// matrices, and the early and late tone controls.
#pragma once

#include "zn_eq_param.h"
#include "zn_matrixing_param.h"
#include "zn_reflections_mod_param.h"
#include "zn_reverberant_u15_param.h"

namespace zen::reverb {

struct zn_reverb_u15_param {
    zn_reverb_u15_param(std::uint32_t inputs = 1, std::uint32_t outputs = 1)
        : tail(outputs),
          reflections(inputs),
          direct(inputs, outputs),
          early(zn_reflections_param::kTaps, outputs) {}

    zn_reverberant_u15_param tail;
    zn_reflections_mod_param reflections;
    zn_matrixing_param direct;  // outputs x inputs
    zn_matrixing_param early;   // outputs x 16 taps
    zn_eq_param earlyEq;        // record entries 16-21
    zn_eq_param lateEq;         // record entries 22-27
};

}  // namespace zen::reverb
