// zenfx validate: the validation battery over one, several or every plug-in.
#include <algorithm>
#include <cstdio>
#include <functional>
#include <iostream>

#include <nlohmann/json.hpp>

#include "Commands.h"
#include "NameSuggestions.h"
#include "TemplateChain.h"
#include "ValidationContext.h"
#include "Validator.h"
#include "ZenfxError.h"

namespace zenfx {

namespace {

constexpr int kCheckColumn = 34;

struct Counts {
    int passed = 0, failed = 0, skipped = 0;
    void Add(const CheckResult& result) {
        switch (result.outcome.status) {
            case CheckStatus::Pass: ++passed; break;
            case CheckStatus::Fail: ++failed; break;
            case CheckStatus::Skip: ++skipped; break;
        }
    }
    std::string Text() const {
        return Count(static_cast<std::uint64_t>(passed), "check") + " passed, " + std::to_string(failed) +
               " failed, " + std::to_string(skipped) + " skipped";
    }
};

std::vector<PluginEntry> ChoosePlugins(PluginLibrary& library, const ValidateOptions& options) {
    if (options.all == !options.plugins.empty())
        throw ZenfxError("validate needs plug-in names or --all, not both", kExitUsage);
    if (!options.templateName.empty() && (options.all || options.plugins.size() != 1))
        throw ZenfxError("--template needs exactly one plug-in (the one with templates: \"AI\")", kExitUsage);
    std::vector<PluginEntry> plugins;
    if (options.all) {
        for (const PluginEntry& plugin : library.List())
            if (plugin.kind == zen::kAudioPluginKind) plugins.push_back(plugin);
        if (plugins.empty()) throw ZenfxError("the library has no audio plug-ins to validate");
    } else {
        for (const std::string& name : options.plugins) plugins.push_back(library.FindAudioPlugin(name));
    }
    return plugins;
}

bool Matches(const std::string& id, const std::vector<std::string>& prefixes) {
    return prefixes.empty() || std::any_of(prefixes.begin(), prefixes.end(), [&](const std::string& prefix) {
               return id.compare(0, prefix.size(), prefix) == 0;
           });
}

// A --check that matches no check would pass by checking nothing.
void RequireKnownChecks(const ValidateOptions& options) {
    std::vector<std::string> ids = Validator::CheckIds();
    if (!options.templateName.empty())
        ids.insert(ids.end(), TemplateChain::CheckIds().begin(), TemplateChain::CheckIds().end());
    std::vector<std::string> groups;
    for (const std::string& id : ids) {
        const std::string group = id.substr(0, id.find('.'));
        if (std::find(groups.begin(), groups.end(), group) == groups.end()) groups.push_back(group);
    }
    for (const std::string& prefix : options.checks) {
        const bool matches =
            std::any_of(ids.begin(), ids.end(), [&](const std::string& id) { return Matches(id, {prefix}); });
        if (matches) continue;
        std::vector<std::string> names = groups;
        names.insert(names.end(), ids.begin(), ids.end());
        std::string list;
        for (const std::string& group : groups) list += (list.empty() ? "" : ", ") + group;
        throw ZenfxError("no check matches --check '" + prefix + "'" + DidYouMean(prefix, names) +
                             " (the groups: " + list + "; zenfx validate prints every check's name)",
                         kExitUsage);
    }
}

}  // namespace

int RunValidate(PluginLibrary& library, const ValidateOptions& options) {
    RequireKnownChecks(options);
    std::vector<PluginEntry> plugins = ChoosePlugins(library, options);
    std::unique_ptr<TemplateChain> chain;
    if (!options.templateName.empty()) {
        chain = std::make_unique<TemplateChain>(library, plugins.front(), options.templateName);
        plugins = chain->Plugins();
        if (!options.json) {
            std::cout << chain->Name() << ":\n";
            chain->Print(std::cout);
            std::cout << std::endl;
        }
    }
    // With only chain checks asked for, the plug-ins' battery is left out.
    const std::vector<std::string> battery = Validator::CheckIds();
    const bool wantsBattery = std::any_of(battery.begin(), battery.end(),
                                          [&](const std::string& id) { return Matches(id, options.checks); });
    Validator validator(library, options);
    Counts total;
    nlohmann::json reports = nlohmann::json::array();
    const auto report = [&](const std::string& name, const std::string& key,
                            const std::function<std::vector<CheckResult>(const ValidationContext::Listener&)>& run) {
        if (!options.json)
            std::cout << name << " (" << key << "), level " << options.level << ", seed " << options.seed << std::endl;
        Counts counts;
        const auto printLine = [&](const CheckResult& result) {
            counts.Add(result);
            if (options.json) return;
            std::printf("  %-4s  %-*s %s\n", StatusName(result.outcome.status), kCheckColumn, result.id.c_str(),
                        result.outcome.reason.c_str());
            std::fflush(stdout);
        };
        const std::vector<CheckResult> results = run(printLine);
        total.passed += counts.passed;
        total.failed += counts.failed;
        total.skipped += counts.skipped;
        if (!options.json) {
            std::cout << name << ": " << counts.Text() << "\n" << std::endl;
            return;
        }
        nlohmann::json checks = nlohmann::json::array();
        for (const CheckResult& result : results)
            checks.push_back({{"id", result.id},
                              {"status", StatusName(result.outcome.status)},
                              {"reason", result.outcome.reason}});
        reports.push_back({{"name", name},
                           {"key", key},
                           {"passed", counts.failed == 0},
                           {"counts", {{"pass", counts.passed}, {"fail", counts.failed}, {"skip", counts.skipped}}},
                           {"checks", checks}});
    };
    for (const PluginEntry& plugin : plugins) {
        if (!wantsBattery) break;
        report(plugin.entry.name, plugin.key,
               [&](const ValidationContext::Listener& listener) { return validator.Validate(plugin, listener); });
    }
    if (chain)
        report(chain->Name(), options.templateName,
               [&](const ValidationContext::Listener& listener) { return chain->Check(options, listener); });
    const std::size_t validated = wantsBattery ? plugins.size() : 0;
    if (options.json) {
        nlohmann::json document = {{"level", options.level},
                                   {"seed", options.seed},
                                   {"passed", total.failed == 0},
                                   {"counts", {{"pass", total.passed}, {"fail", total.failed}, {"skip", total.skipped}}},
                                   {"plugins", reports}};
        std::cout << document.dump(2) << std::endl;
    } else {
        std::cout << "zenfx validate: " << validated << " plug-in" << (validated == 1 ? "" : "s")
                  << (chain ? " and the chain" : "") << ", " << total.Text() << std::endl;
    }
    return total.failed == 0 ? 0 : kExitFailure;
}

}  // namespace zenfx
