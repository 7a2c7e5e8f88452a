// zenfx validate: the validation battery over one, several or every plug-in.
#include <cstdio>
#include <iostream>

#include <nlohmann/json.hpp>

#include "Commands.h"
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

}  // namespace

int RunValidate(PluginLibrary& library, const ValidateOptions& options) {
    const std::vector<PluginEntry> plugins = ChoosePlugins(library, options);
    Validator validator(library, options);
    Counts total;
    nlohmann::json reports = nlohmann::json::array();
    for (const PluginEntry& plugin : plugins) {
        if (!options.json)
            std::cout << plugin.entry.name << " (" << plugin.key << "), level " << options.level << ", seed "
                      << options.seed << std::endl;
        Counts counts;
        const auto printLine = [&](const CheckResult& result) {
            counts.Add(result);
            if (options.json) return;
            std::printf("  %-4s  %-*s %s\n", StatusName(result.outcome.status), kCheckColumn, result.id.c_str(),
                        result.outcome.reason.c_str());
            std::fflush(stdout);
        };
        const std::vector<CheckResult> results = validator.Validate(plugin, printLine);
        total.passed += counts.passed;
        total.failed += counts.failed;
        total.skipped += counts.skipped;
        if (!options.json) {
            std::cout << plugin.entry.name << ": " << counts.Text() << "\n" << std::endl;
            continue;
        }
        nlohmann::json checks = nlohmann::json::array();
        for (const CheckResult& result : results)
            checks.push_back({{"id", result.id},
                              {"status", StatusName(result.outcome.status)},
                              {"reason", result.outcome.reason}});
        reports.push_back({{"name", plugin.entry.name},
                           {"key", plugin.key},
                           {"passed", counts.failed == 0},
                           {"counts", {{"pass", counts.passed}, {"fail", counts.failed}, {"skip", counts.skipped}}},
                           {"checks", checks}});
    }
    if (options.json) {
        nlohmann::json document = {{"level", options.level},
                                   {"seed", options.seed},
                                   {"passed", total.failed == 0},
                                   {"counts", {{"pass", total.passed}, {"fail", total.failed}, {"skip", total.skipped}}},
                                   {"plugins", reports}};
        std::cout << document.dump(2) << std::endl;
    } else {
        std::cout << "zenfx validate: " << plugins.size() << " plug-in" << (plugins.size() == 1 ? "" : "s") << ", "
                  << total.Text() << std::endl;
    }
    return total.failed == 0 ? 0 : kExitFailure;
}

}  // namespace zenfx
