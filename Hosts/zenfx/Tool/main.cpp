// zenfx: the command-line host of the ZenAudioPlugins library.
#include <CLI/CLI.hpp>
#include <iostream>

#include "Commands.h"
#include "SignalCleanup.h"
#include "ZenfxError.h"

namespace {

// Walks the process options in command-line order, so that every --set,
// --preset, --template and --learn belongs to the --plugin named before it.
std::vector<zenfx::StageSpec> CollectStages(const CLI::App& process, const CLI::Option* plugin,
                                            const CLI::Option* set, const CLI::Option* preset,
                                            const CLI::Option* templateOption, const CLI::Option* learn) {
    std::vector<zenfx::StageSpec> stages;
    std::size_t pluginIndex = 0, setIndex = 0, presetIndex = 0, templateIndex = 0, learnIndex = 0;
    for (const CLI::Option* option : process.parse_order()) {
        if (option == plugin) {
            stages.push_back({option->results().at(pluginIndex++), {}, {}});
            continue;
        }
        if (option == learn) {
            const std::string& region = option->results().at(learnIndex++);
            if (stages.empty())
                throw zenfx::ZenfxError("--learn " + region + " comes before any --plugin", zenfx::kExitUsage);
            stages.back().learn = region;
            continue;
        }
        std::string name;
        std::size_t* index = nullptr;
        if (option == set) name = "--set", index = &setIndex;
        else if (option == preset) name = "--preset", index = &presetIndex;
        else if (option == templateOption) name = "--template", index = &templateIndex;
        else continue;
        const std::string& value = option->results().at((*index)++);
        if (stages.empty())
            throw zenfx::ZenfxError(name + " " + value + " comes before any --plugin", zenfx::kExitUsage);
        stages.back().actions.emplace_back(name, value);
    }
    return stages;
}

// The --set and --preset of render, in command-line order.
std::vector<std::pair<std::string, std::string>> CollectActions(const CLI::App& command, const CLI::Option* set,
                                                                const CLI::Option* preset) {
    std::vector<std::pair<std::string, std::string>> actions;
    std::size_t setIndex = 0, presetIndex = 0;
    for (const CLI::Option* option : command.parse_order()) {
        if (option == set) actions.emplace_back("--set", option->results().at(setIndex++));
        else if (option == preset) actions.emplace_back("--preset", option->results().at(presetIndex++));
    }
    return actions;
}

}  // namespace

int main(int argc, char** argv) {
    CLI::App app{"zenfx: runs ZenAudioPlugins over audio files"};
    app.require_subcommand(1);
    std::string libraryPath;
    app.add_option("--library", libraryPath, "Path of libZenAudioPlugins.so (default: beside zenfx)");

    bool listJson = false;
    CLI::App* list = app.add_subcommand("list", "List every plug-in of the library");
    list->add_flag("--json", listJson, "Print JSON");

    zenfx::InfoOptions info;
    CLI::App* infoCommand = app.add_subcommand("info", "Show a plug-in's parameters, meters and latency");
    infoCommand->add_option("PLUGIN", info.plugin, "Display name or key, case-insensitive")->required();
    infoCommand->add_flag("--json", info.json, "Print JSON");
    infoCommand->add_option("--rate", info.sampleRate, "Sample rate for the latency (Hz)")
        ->check(CLI::Range(8000, 384000));

    zenfx::ProcessOptions process;
    std::vector<std::string> plugins, sets, presets, learns;
    CLI::App* processCommand = app.add_subcommand("process", "Run a chain of plug-ins over an audio file");
    processCommand->add_option("INPUT", process.input, "Input file (WAV, FLAC, AIFF, ...); none: demo material");
    processCommand->add_option("-o,--output", process.output, "Output file; its extension picks the type")
        ->required();
    CLI::Option* pluginOption =
        processCommand->add_option("--plugin", plugins, "Plug-in by name or key; repeat for a chain")
            ->expected(1)
            ->multi_option_policy(CLI::MultiOptionPolicy::TakeAll)
            ->allow_extra_args(false);
    CLI::Option* setOption =
        processCommand->add_option("--set", sets, "PARAM=VALUE for the plug-in named before it")
            ->expected(1)
            ->multi_option_policy(CLI::MultiOptionPolicy::TakeAll)
            ->allow_extra_args(false);
    CLI::Option* presetOption =
        processCommand->add_option("--preset", presets, "Factory preset of the plug-in named before it")
            ->expected(1)
            ->multi_option_policy(CLI::MultiOptionPolicy::TakeAll)
            ->allow_extra_args(false);
    std::vector<std::string> templates;
    CLI::Option* templateOption =
        processCommand
            ->add_option("--template", templates,
                         "Control template of the plug-in named before it (\"AI\": AI_Dialog, AI_SFX, ...)")
            ->expected(1)
            ->multi_option_policy(CLI::MultiOptionPolicy::TakeAll)
            ->allow_extra_args(false);
    processCommand->add_flag("-v,--verbose", process.verbose, "Also say what the chain's plug-ins skipped");
    CLI::Option* learnOption =
        processCommand
            ->add_option("--learn", learns, "START:END seconds the plug-in named before it learns from (its \"Learn\")")
            ->expected(1)
            ->multi_option_policy(CLI::MultiOptionPolicy::TakeAll)
            ->allow_extra_args(false);
    processCommand->add_option("--block", process.block, "Block size in frames (default 512)");
    bool noCompensation = false;
    processCommand->add_flag("--no-latency-compensation", noCompensation,
                             "Keep the chain's delay instead of aligning output with input");
    processCommand->add_option("--format", process.format,
                               "Sample format: pcm16, pcm24, pcm32, float, double (any case)");
    processCommand->add_option("--meters-json", process.metersJson, "Write every plug-in's final meters here");

    zenfx::ValidateOptions validate;
    CLI::App* validateCommand =
        app.add_subcommand("validate", "Run the validation battery over plug-ins; non-zero exit on any failure");
    validateCommand->add_option("PLUGIN", validate.plugins, "Display names or keys, case-insensitive");
    validateCommand->add_flag("--all", validate.all, "Every audio plug-in of the library");
    validateCommand->add_option("--template", validate.templateName,
                                "Build the plug-in's template chain (\"AI\": AI_SFX, ...) and validate it and "
                                "every plug-in in it");
    validateCommand->add_option("--level", validate.level, "1 quick .. 5 longest (default 3)")
        ->check(CLI::Range(1, 5));
    validateCommand->add_option("--seed", validate.seed, "Seed of the random choices (default 1)");
    validateCommand->add_option("--check", validate.checks, "Only checks whose name starts with this; repeatable")
        ->expected(1)
        ->multi_option_policy(CLI::MultiOptionPolicy::TakeAll)
        ->allow_extra_args(false);
    validateCommand->add_flag("--json", validate.json, "Print JSON");

    zenfx::ControlOptions control;
    CLI::App* controlCommand = app.add_subcommand("control", "Show and change the console's settings documents");
    controlCommand->require_subcommand(1);
    controlCommand->add_option("--config-dir", control.configFolder,
                               "Folder of the settings documents (default: $XDG_CONFIG_HOME/ZenAudioPlugins)");
    CLI::App* controlList = controlCommand->add_subcommand("list", "Every control plug-in and its document");
    controlList->add_flag("--json", control.json, "Print JSON");
    CLI::App* controlShow = controlCommand->add_subcommand("show", "Every setting of a control plug-in's document");
    controlShow->add_option("NAME", control.plugin, "Control plug-in, any case")->required();
    controlShow->add_flag("--json", control.json, "Print JSON");
    CLI::App* controlSet = controlCommand->add_subcommand("set", "Change settings; the document is replaced atomically");
    controlSet->add_option("NAME", control.plugin, "Control plug-in, any case")->required();
    controlSet->add_option("KEY=VALUE", control.assignments, "Settings by key, as show lists them")->required();
    controlSet->add_flag("--json", control.json, "Print the document as JSON");
    CLI::App* controlRun = controlCommand->add_subcommand(
        "run", "Render the test tone (-o FILE) or run the performance test");
    controlRun->add_option("NAME", control.plugin, "\"Test Tones Settings\" or \"Performance Testing\"")->required();
    controlRun->add_option("-o,--output", control.output, "Test tones: the audio file to write");
    controlRun->add_flag("--json", control.json, "Performance: print JSON");
    for (CLI::App* sub : {controlList, controlShow, controlSet, controlRun})
        sub->add_option("--config-dir", control.configFolder, "Folder of the settings documents");

    zenfx::AnalyzeOptions analyze;
    double analyzeTarget = 0.0;
    CLI::App* analyzeCommand =
        app.add_subcommand("analyze", "Loudness (EBU R 128), true peak and RMS of audio files");
    analyzeCommand->add_option("FILE", analyze.files, "Audio files (WAV, FLAC, AIFF, ...)")->required();
    analyzeCommand->add_flag("--json", analyze.json, "Print JSON");
    CLI::Option* targetOption = analyzeCommand->add_option("--target", analyzeTarget,
                                                           "Loudness to reach (LUFS): report the gain it takes")
                                    ->check(CLI::Range(-70.0, 0.0));

    zenfx::RenderOptions render;
    std::vector<std::string> renderSets, renderPresets;
    CLI::App* renderCommand =
        app.add_subcommand("render", "Play a plug-in without audio input (Foley Sampler) from a trigger list");
    renderCommand->add_option("PLUGIN", render.plugin, "Display name or key, case-insensitive")->required();
    renderCommand->add_option("--triggers", render.triggers, "File of 'TIME PAD' lines, time in seconds")->required();
    renderCommand->add_option("-o,--output", render.output, "Output file; its extension picks the type")->required();
    CLI::Option* renderSetOption = renderCommand->add_option("--set", renderSets, "PARAM=VALUE")
                                       ->expected(1)
                                       ->multi_option_policy(CLI::MultiOptionPolicy::TakeAll)
                                       ->allow_extra_args(false);
    CLI::Option* renderPresetOption = renderCommand->add_option("--preset", renderPresets, "Factory preset")
                                          ->expected(1)
                                          ->multi_option_policy(CLI::MultiOptionPolicy::TakeAll)
                                          ->allow_extra_args(false);
    renderCommand->add_option("--state-set", render.stateFields, "KEY=VALUE text field of the state (folder=PATH)")
        ->expected(1)
        ->multi_option_policy(CLI::MultiOptionPolicy::TakeAll)
        ->allow_extra_args(false);
    renderCommand->add_option("--rate", render.sampleRate, "Sample rate (Hz, default 48000)")
        ->check(CLI::Range(8000, 384000));
    renderCommand->add_option("--channels", render.channels, "Output channels (default 2)");
    renderCommand->add_option("--block", render.block, "Largest block in frames (default 512)");
    renderCommand->add_option("--length", render.seconds, "Seconds to render (default: to the end of the last sound)")
        ->check(CLI::Range(0.0, 3600.0));
    renderCommand->add_option("--format", render.format, "Sample format: pcm16, pcm24, pcm32, float, double");

    zenfx::ScreenshotOptions screenshot;
    double screenshotAt = 0.0;
    CLI::App* screenshotCommand = app.add_subcommand(
        "screenshot", "Render a plug-in's editor to a PNG after it processed audio (no display needed)");
    screenshotCommand->add_option("PLUGIN", screenshot.plugin, "Display name or key, case-insensitive")->required();
    screenshotCommand->add_option("--preset", screenshot.preset, "Factory preset loaded first");
    screenshotCommand->add_option("--input", screenshot.input, "Audio file processed first (default: the demo material)");
    CLI::Option* atOption = screenshotCommand->add_option(
        "--at", screenshotAt, "Seconds of the input processed before the picture (default 3, or the whole input)");
    screenshotCommand->add_option("--scale", screenshot.scale, "1 or 2 (twice the pixels)")->check(CLI::IsMember({1, 2}));
    screenshotCommand->add_option("-o,--output", screenshot.output, "The PNG to write")->required();

    zenfx::EditOptions edit;
    CLI::App* editCommand =
        app.add_subcommand("edit", "Open a plug-in's editor in a window; with a file, play it through in a loop");
    editCommand->add_option("PLUGIN", edit.plugin, "Display name or key, case-insensitive")->required();
    editCommand->add_option("FILE", edit.input, "Audio file played through the plug-in at the audio rate");
    editCommand->add_option("--preset", edit.preset, "Factory preset loaded first");
    editCommand->add_option("--scale", edit.scale, "1 or 2")->check(CLI::IsMember({1, 2}));

    std::string demoOutput, demoFormat;
    CLI::App* demo = app.add_subcommand("demo", "Write the built-in demo material to a file");
    demo->add_option("-o,--output", demoOutput, "Output file")->required();
    demo->add_option("--format", demoFormat, "Sample format: pcm16, pcm24, pcm32, float, double");

    try {
        app.parse(argc, argv);
    } catch (const CLI::Success& e) {
        return app.exit(e);
    } catch (const CLI::ParseError& e) {
        std::cerr << "zenfx: " << e.what() << " (zenfx --help shows the usage)\n";
        return zenfx::kExitUsage;
    }

    zenfx::InstallSignalCleanup();
    try {
        if (*demo) return zenfx::RunDemo(demoOutput, demoFormat);
        zenfx::PluginLibrary library(libraryPath);
        if (*list) return zenfx::RunList(library, listJson);
        if (*infoCommand) return zenfx::RunInfo(library, info);
        if (*validateCommand) return zenfx::RunValidate(library, validate);
        if (*analyzeCommand) {
            if (*targetOption) analyze.target = analyzeTarget;
            return zenfx::RunAnalyze(library, analyze);
        }
        if (*controlCommand) {
            for (CLI::App* sub : controlCommand->get_subcommands()) control.action = sub->get_name();
            return zenfx::RunControl(library, control);
        }
        if (*screenshotCommand) {
            if (*atOption) screenshot.at = screenshotAt;
            return zenfx::RunScreenshot(library, screenshot);
        }
        if (*editCommand) return zenfx::RunEdit(library, edit);
        if (*renderCommand) {
            render.actions = CollectActions(*renderCommand, renderSetOption, renderPresetOption);
            return zenfx::RunRender(library, render);
        }
        process.stages = CollectStages(*processCommand, pluginOption, setOption, presetOption, templateOption, learnOption);
        process.compensateLatency = !noCompensation;
        return zenfx::RunProcess(library, process);
    } catch (const zenfx::ZenfxError& e) {
        std::cerr << "zenfx: " << e.what() << "\n";
        return e.ExitCode();
    } catch (const std::exception& e) {
        std::cerr << "zenfx: " << e.what() << "\n";
        return zenfx::kExitFailure;
    }
}
