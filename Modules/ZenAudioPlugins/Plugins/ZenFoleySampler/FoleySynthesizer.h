// The built-in sounds, made from noise, filters and damped modes rather
// than recordings: footsteps on four surfaces, cloth, a door's creak, latch
// and slam, and impacts on wood, metal and a soft body. Each pad has a few
// takes that differ the way repeated real events do.
#pragma once

#include <cstdint>
#include <vector>

#include "FoleyBank.h"

class FoleySynthesizer {
public:
    static constexpr double kSampleRate = 48000.0;
    static constexpr int kTakesPerPad = 4;
    // Every take is scaled to this peak (-6 dBFS), leaving room for overlaps.
    static constexpr float kTakePeak = 0.5f;

    // Deterministic: the same pads in every process.
    static std::vector<FoleyBank::Pad> MakePads();
};
