// Realtime factor of an LV2 plug-in run through lilv as a Linux host runs
// it: 48 kHz, 512-frame blocks, every audio input walking its own second of
// noise, controls at their defaults; URID mapping and empty atom sequences
// for plug-ins that ask for them.
#pragma once

#include <benchmark/benchmark.h>
#include <lilv/lilv.h>

namespace zenbench {

void RunLv2(benchmark::State& state, LilvWorld* world, const LilvPlugin* plugin);

}  // namespace zenbench
