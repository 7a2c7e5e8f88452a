// Realtime factor of a plug-in: seconds of audio processed per second of CPU.
#pragma once

#include <benchmark/benchmark.h>

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "zen/Zen.h"

namespace zenbench {

constexpr double kSampleRate = 48000.0;
constexpr std::uint32_t kBlock = 512;

// Creates the registered plug-in `name`, lets `setup` set parameters,
// prepares it for `channels` at `sampleRate` (48 kHz unless given) in
// 512-frame blocks and processes full-scale noise for as long as the
// benchmark runs. Reports "realtime".
void RunPlugin(benchmark::State& state, const std::string& name, std::uint32_t channels,
               const std::function<void(AudioPlugin&)>& setup = {}, double sampleRate = kSampleRate);

// Sets a parameter by label or identifier.
void Set(AudioPlugin& plugin, const char* labelOrIdentifier, float value);

// Adds the "realtime" counter for `frames` processed per iteration.
void ReportRealtime(benchmark::State& state, double framesPerIteration, double sampleRate = kSampleRate);

}  // namespace zenbench
