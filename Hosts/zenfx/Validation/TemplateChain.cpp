#include "TemplateChain.h"

#include <algorithm>
#include <cmath>
#include <random>

#include "StageSettings.h"
#include "ValidationSignals.h"
#include "ZenfxError.h"

namespace zenfx {

namespace {
constexpr double kRate = ValidationContext::kSampleRate;
constexpr std::uint32_t kBlock = ValidationContext::kBlock;
}  // namespace

const std::vector<std::string>& TemplateChain::CheckIds() {
    static const std::vector<std::string> ids = {"chain.actions", "chain.process"};
    return ids;
}

TemplateChain::TemplateChain(PluginLibrary& library, const PluginEntry& plugin, const std::string& templateName)
    : m_library(library),
      m_name(plugin.entry.name + ", " + templateName + " chain"),
      m_studio(std::make_unique<zen::host::StudioModel>(library.Interface())) {
    m_studio->AddChannel(m_name, kChannels);
    m_studio->InsertPlugin(kChannel, plugin.key);
    StageSettings(m_studio->PluginAt(kChannel, 0), plugin.entry.name, [](const std::string&) {})
        .UseTemplate(templateName);
    m_report = std::make_unique<ChainReport>(*m_studio);
    m_studio->RunBackgroundTasks(kChannel, false);
}

std::vector<PluginEntry> TemplateChain::Plugins() const {
    std::vector<PluginEntry> plugins;
    for (const auto& slot : m_studio->GetChannel(kChannel).chain) {
        const bool seen = std::any_of(plugins.begin(), plugins.end(),
                                      [&](const PluginEntry& p) { return p.key == slot.key; });
        if (!seen) plugins.push_back(m_library.FindAudioPlugin(slot.key));
    }
    return plugins;
}

CheckOutcome TemplateChain::CheckActions() const {
    const std::vector<std::string> failures = m_report->Failures();
    if (!failures.empty()) return Fail(failures.front());
    std::size_t set = 0, skipped = 0;
    for (const auto& record : m_report->Records()) {
        if (record.parameterSet) ++set;
        if (record.note.rfind("skipped", 0) == 0) ++skipped;
    }
    const std::size_t slots = m_studio->GetChannel(kChannel).chain.size();
    return Pass(Count(slots, "slot") + ", " + Count(set, "parameter") + " set, " + std::to_string(skipped) +
                " skipped (not in the target)");
}

CheckOutcome TemplateChain::CheckProcess(std::uint32_t seed) {
    m_studio->Prepare(kRate, kBlock);
    std::mt19937 random(seed);
    const auto frames = static_cast<std::size_t>(kSeconds * kRate);
    const Planar input = signals::Noise(kChannels, frames, ValidationContext::kTestLevel, random);
    Planar output = input;
    std::vector<float*> pointers(kChannels);
    for (std::size_t at = 0; at < frames; at += kBlock) {
        const std::size_t count = std::min<std::size_t>(kBlock, frames - at);
        for (std::uint32_t c = 0; c < kChannels; ++c) pointers[c] = output[c].data() + at;
        if (!m_studio->Process(kChannel, pointers.data(), count))
            return Fail("the chain refused the block at frame " + std::to_string(at));
        m_studio->RunBackgroundTasks(kChannel, false);
    }
    m_studio->RunBackgroundTasks(kChannel, true);
    const std::string fault = signals::DescribeFault(signals::Inspect(output));
    if (!fault.empty()) return Fail("noise through the chain: " + fault);
    return Pass(Count(frames, "frame") + " of noise through " +
                Count(m_studio->GetChannel(kChannel).chain.size(), "slot") + ", output finite and in range");
}

std::vector<CheckResult> TemplateChain::Check(const ValidateOptions& options,
                                              const ValidationContext::Listener& listener) {
    const auto wanted = [&](const std::string& id) {
        return options.checks.empty() || std::any_of(options.checks.begin(), options.checks.end(),
                                                     [&](const std::string& p) { return id.rfind(p, 0) == 0; });
    };
    std::vector<CheckResult> results;
    const auto run = [&](const std::string& id, const std::function<CheckOutcome()>& check) {
        if (!wanted(id)) return;
        CheckResult result{id, {}};
        try {
            result.outcome = check();
        } catch (const std::exception& e) {
            result.outcome = Fail(e.what());
        }
        if (listener) listener(result);
        results.push_back(result);
    };
    run("chain.actions", [&] { return CheckActions(); });
    run("chain.process", [&] { return CheckProcess(options.seed); });
    return results;
}

}  // namespace zenfx
