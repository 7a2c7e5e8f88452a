// The validation battery of one plug-in: lifecycle, parameters, blocks,
// signals, latency, threads and real-time safety, in that order (real-time
// safety last, as it judges every Process call the others made).
#pragma once

#include <vector>

#include "CheckResult.h"
#include "Commands.h"
#include "PluginLibrary.h"
#include "ValidationContext.h"

namespace zenfx {

class Validator {
public:
    Validator(PluginLibrary& library, const ValidateOptions& options) : m_library(library), m_options(options) {}

    // Every check the options ask for; `listener` hears each as it ends.
    std::vector<CheckResult> Validate(const PluginEntry& plugin, const ValidationContext::Listener& listener);

    // The id of every check, in the order they run.
    static std::vector<std::string> CheckIds();

private:
    static void RunGroups(ValidationContext& context);

    PluginLibrary& m_library;
    const ValidateOptions& m_options;
};

}  // namespace zenfx
