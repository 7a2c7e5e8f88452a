// The mix law of the delays and echoes: up to 50 % the dry signal stays
// whole while the repeats come up, from 50 % the repeats are whole while the
// dry signal goes down, so the middle keeps both at full level.
#pragma once

#include <algorithm>

namespace zen {

inline float EchoDryGain(float mix) { return std::min(1.0f, 2.0f * (1.0f - mix)); }
inline float EchoWetGain(float mix) { return std::min(1.0f, 2.0f * mix); }

}  // namespace zen
