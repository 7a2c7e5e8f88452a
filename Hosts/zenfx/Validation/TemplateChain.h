// A plug-in's template chain for `zenfx validate --template`: the plug-in
// alone on a stereo channel, its template chosen, one round of background
// work (as zenfx process does), so the template loads and sets its targets.
// Its own checks judge the chain as the template left it; every plug-in in
// it also gets the battery.
#pragma once

#include <memory>
#include <ostream>
#include <string>
#include <vector>

#include "ChainReport.h"
#include "CheckResult.h"
#include "Commands.h"
#include "PluginLibrary.h"
#include "ValidationContext.h"

namespace zenfx {

class TemplateChain {
public:
    static constexpr std::uint32_t kChannels = 2;
    static constexpr double kSeconds = 1.0;  // of noise through the chain
    static const std::vector<std::string>& CheckIds();

    // Throws ZenfxError when the plug-in has no such template.
    TemplateChain(PluginLibrary& library, const PluginEntry& plugin, const std::string& templateName);

    // "AI, AI_SFX chain"
    const std::string& Name() const { return m_name; }
    // Each plug-in of the chain once, in slot order.
    std::vector<PluginEntry> Plugins() const;
    void Print(std::ostream& out) const { m_report->Print(out, kChannel); }

    // The chain checks the options ask for; `listener` hears each.
    std::vector<CheckResult> Check(const ValidateOptions& options, const ValidationContext::Listener& listener);

private:
    static constexpr std::size_t kChannel = 0;
    CheckOutcome CheckActions() const;
    CheckOutcome CheckProcess(std::uint32_t seed);

    PluginLibrary& m_library;
    std::string m_name;
    std::unique_ptr<zen::host::StudioModel> m_studio;
    std::unique_ptr<ChainReport> m_report;
};

}  // namespace zenfx
