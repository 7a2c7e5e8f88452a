// Conversions from a parameter's value (in its unit) to the working value a
// smoothed parameter carries into the DSP. A table row names one:
//
//   zen::ContinuousParameter("THRESHOLD", ..., "dB").Smoothed(zen::working::DbToGainFloored)
//
// A plug-in with its own law writes a plain function of the same shape.
#pragma once

#include "Decibels.h"

namespace zen {

using WorkingValue = float (*)(float value);

namespace working {

inline float Identity(float value) { return value; }

// 10^(dB/20).
inline float DbToGain(float db) { return zen::DbToGain(db); }

// 10^(dB/20), never below the smallest normal float.
inline float DbToGainFloored(float db) { return zen::DbToGainFloored(db); }

// A percentage as a fraction: 50 % is 0.5.
inline float PercentToFraction(float percent) { return percent / 100.0f; }

}  // namespace working
}  // namespace zen
