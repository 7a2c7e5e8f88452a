// Meters as JSON, mapped from any plug-in's meter table: zenfx info
// describes them, --meters-json writes their readings (MeterRecorder).
#pragma once

#include <cstdint>

#include <nlohmann/json.hpp>

#include "zen/Zen.h"

namespace zenfx {

// "level", "value", "array" or "ring".
const char* MeterKindName(zen::MeterKind kind);

// {identifier, name, unit, kind, minimum, maximum}, with size for arrays and
// size and capacity for rings.
nlohmann::json DescribeMeter(const zen::MeterInfo& info);

// {identifier, name, unit, kind, final}: the reading now, a number for level
// (dB) and value meters, an array of numbers for arrays (null when it could
// not be read). Rings hold a history rather than a reading: null.
nlohmann::json ReadMeter(const AudioPlugin& audio, std::uint32_t index);

}  // namespace zenfx
