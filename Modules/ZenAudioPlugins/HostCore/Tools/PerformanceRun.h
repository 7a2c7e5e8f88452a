// "Performance Testing": every audio plug-in of a library run on the null
// device at a rate, block size and channel count, over fresh noise, with the
// CPU time of the processing thread measured. The realtime factor is audio
// seconds per CPU second; the CPU load is its inverse in percent.
#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "HostCore/Settings/Documents/PerformanceDocument.h"
#include "zen/Zen.h"

namespace zen::host {

struct PerformanceResult {
    std::string name;
    std::string key;
    std::uint32_t channels = 0;
    double audioSeconds = 0.0;
    double cpuSeconds = 0.0;
    double realtimeFactor = 0.0;
    double cpuLoad = 0.0;  // percent of one core at the audio rate
    std::string error;     // why the plug-in could not run; empty when it ran
};

class PerformanceRun {
public:
    using Settings = PerformanceDocument::Run;
    // Audio before the measured part, so caches and lazy set-up settle.
    static constexpr double kWarmUpFraction = 0.1;
    static constexpr double kMaximumWarmUp = 0.25;  // s

    // Every plug-in (or those the settings name, by display name, any case),
    // in key order. `progress` hears each result as it comes. Throws
    // HostError for a name the library does not have.
    static std::vector<PerformanceResult> Run(zen::PluginInterface& library, const Settings& settings,
                                              const std::function<void(const PerformanceResult&)>& progress = {});
    static PerformanceResult RunPlugin(zen::PluginInterface& library, const std::string& key,
                                       const zen::PluginListEntry& entry, const Settings& settings);
};

}  // namespace zen::host
