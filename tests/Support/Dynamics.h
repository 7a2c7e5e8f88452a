// Level steps and what a dynamics processor did with them.
#pragma once

#include <cstddef>
#include <utility>
#include <vector>

namespace zentest {

// A square wave at the given peak levels (dB), each from its frame on: every
// sample has the level's magnitude, so detectors see it without ripple.
std::vector<float> LevelSteps(std::size_t frames, const std::vector<std::pair<std::size_t, double>>& levelsDb);

// The gain in dB applied at frame n.
double GainDb(const std::vector<float>& out, const std::vector<float>& in, std::size_t n);

// Frames from `from` (counting it) until the applied gain has gone 63.2 % of
// the way from `startDb` to `endDb`: one time constant of a one-pole envelope.
double TimeConstantFrames(const std::vector<float>& out, const std::vector<float>& in, std::size_t from,
                          double startDb, double endDb);

}  // namespace zentest
