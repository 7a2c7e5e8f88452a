// Checks that every analyser passes: the audio comes out bit for bit as it
// went in, and every meter (levels, values, arrays, ring records) reads the
// same whatever the block split.
#pragma once

#include <string>
#include <utility>
#include <vector>

#include "PluginHarness.h"

namespace zentest {

// Everything the meters of a plug-in hold after a run: scalar readings,
// array publications and every ring record still held, in meter order.
std::vector<std::vector<float>> ReadAllMeters(AudioPlugin& audio);

// The last ring record of the meter named `name` (empty when none).
std::vector<float> LastRingRecord(AudioPlugin& audio, const std::string& name);

// Distinct noise on each of `channels`, through fresh instances in blocks of
// 1, 7, 333 and 4096 frames: outputs equal the input and the meters match.
void ExpectTransparentAndSplitInvariant(const std::string& name, std::uint32_t channels,
                                        const std::vector<std::pair<std::string, float>>& settings = {},
                                        std::size_t frames = 12000);

}  // namespace zentest
