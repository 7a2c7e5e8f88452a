#include "MeterJson.h"

#include <vector>

namespace zenfx {

const char* MeterKindName(zen::MeterKind kind) {
    switch (kind) {
        case zen::MeterKind::Level: return "level";
        case zen::MeterKind::Value: return "value";
        case zen::MeterKind::Array: return "array";
        case zen::MeterKind::Ring: return "ring";
    }
    return "unknown";
}

nlohmann::json DescribeMeter(const zen::MeterInfo& info) {
    nlohmann::json row = {{"identifier", info.identifier}, {"name", info.name},       {"unit", info.unit},
                          {"kind", MeterKindName(info.kind)}, {"minimum", info.minimum}, {"maximum", info.maximum}};
    if (info.kind == zen::MeterKind::Array || info.kind == zen::MeterKind::Ring) row["size"] = info.size;
    if (info.kind == zen::MeterKind::Ring) row["capacity"] = info.capacity;
    return row;
}

nlohmann::json ReadMeter(const AudioPlugin& audio, std::uint32_t index) {
    zen::MeterInfo info;
    if (!audio.GetMeterInfo(index, info)) return nullptr;
    nlohmann::json row = {{"identifier", info.identifier}, {"name", info.name}, {"unit", info.unit},
                          {"kind", MeterKindName(info.kind)}};
    switch (info.kind) {
        case zen::MeterKind::Level:
        case zen::MeterKind::Value: row["final"] = audio.GetMeter(index); break;
        case zen::MeterKind::Array: {
            std::vector<float> values(info.size);
            if (audio.ReadMeterArray(index, values.data(), info.size)) row["final"] = values;
            else row["final"] = nullptr;
            break;
        }
        case zen::MeterKind::Ring: row["final"] = nullptr; break;
    }
    return row;
}

}  // namespace zenfx
