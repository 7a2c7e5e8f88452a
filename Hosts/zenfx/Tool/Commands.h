// The zenfx subcommands.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "PluginLibrary.h"

namespace zenfx {

struct InfoOptions {
    std::string plugin;
    bool json = false;
    int sampleRate = 48000;
};

struct StageSpec {
    std::string plugin;
    // In command-line order: {"--preset", name}, {"--set", "PARAM=VALUE"} or
    // {"--template", name}.
    std::vector<std::pair<std::string, std::string>> actions;
    std::string learn;  // --learn START:END (seconds); empty: none
};

struct ProcessOptions {
    std::string input;  // empty: the demo material
    std::string output;
    std::vector<StageSpec> stages;
    std::uint32_t block = 512;
    bool compensateLatency = true;
    std::string format;
    std::string metersJson;
    bool verbose = false;
};

struct ValidateOptions {
    std::vector<std::string> plugins;  // display names or keys
    bool all = false;
    int level = 3;  // 1 quick .. 5 longest
    std::uint32_t seed = 1;
    bool json = false;
    std::vector<std::string> checks;  // only checks whose id starts with one of these
    // One plug-in's template: its chain is built and every plug-in in it validated.
    std::string templateName;
};

struct ControlOptions {
    std::string action;  // list, show, set, run
    std::string plugin;  // registry name of a control plug-in, any case
    std::vector<std::string> assignments;  // set: key=value
    std::string configFolder;              // empty: the XDG config folder
    std::string output;                    // run "Test Tones Settings": the file
    bool json = false;
};

struct AnalyzeOptions {
    std::vector<std::string> files;
    bool json = false;
    std::optional<double> target;  // LUFS: report the gain that reaches it
};

struct RenderOptions {
    std::string plugin;
    std::string triggers;  // the trigger list file
    std::string output;
    // In command-line order: {"--preset", name} or {"--set", "PARAM=VALUE"}.
    std::vector<std::pair<std::string, std::string>> actions;
    std::vector<std::string> stateFields;  // KEY=VALUE text fields of the state
    int sampleRate = 48000;
    std::uint32_t channels = 2;
    std::uint32_t block = 512;
    double seconds = 0.0;  // 0: the last trigger and the plug-in's tail
    std::string format;
};

// The pictures of editors start after this much of their input.
constexpr double kDefaultScreenshotSeconds = 3.0;

struct ScreenshotOptions {
    std::string plugin;
    std::string preset;
    std::string input;         // empty: the demo material
    std::optional<double> at;  // seconds of input processed first; none: 3 s or the whole input
    int scale = 1;             // 1 or 2
    std::string output;
};

struct EditOptions {
    std::string plugin;
    std::string preset;
    std::string input;  // empty: the editor alone
    int scale = 1;
};

int RunList(PluginLibrary& library, bool json);
int RunInfo(PluginLibrary& library, const InfoOptions& options);
int RunProcess(PluginLibrary& library, const ProcessOptions& options);
int RunValidate(PluginLibrary& library, const ValidateOptions& options);
int RunControl(PluginLibrary& library, const ControlOptions& options);
int RunAnalyze(PluginLibrary& library, const AnalyzeOptions& options);
int RunRender(PluginLibrary& library, const RenderOptions& options);
int RunScreenshot(PluginLibrary& library, const ScreenshotOptions& options);
int RunEdit(PluginLibrary& library, const EditOptions& options);
int RunDemo(const std::string& output, const std::string& format);

}  // namespace zenfx
