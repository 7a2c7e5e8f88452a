// zenfx validate end to end: every registered plug-in passes, and each check
// fails on the test plug-in that carries its fault.
#include <gtest/gtest.h>

#include <algorithm>
#include <nlohmann/json.hpp>
#include <set>
#include <sstream>

#include "../ZenfxRunner.h"

using zentest::RunZenfx;

namespace {

// The quick level, as `make test` runs it under the sanitizers.
const std::string kQuick = "1";

nlohmann::json ValidateJson(const std::vector<std::string>& arguments, int expectedExit) {
    std::vector<std::string> command = arguments;
    command.insert(command.end(), {"--level", kQuick, "--json"});
    const auto result = RunZenfx(command);
    EXPECT_EQ(result.exitCode, expectedExit) << result.err << result.out;
    return nlohmann::json::parse(result.out, nullptr, false);
}

// "Test Delay" is healthy and lives in the test library; the plug-ins with a
// fault each live in a library of their own.
std::vector<std::string> TestLibrary(const std::string& plugin) {
    return {"--library", ZEN_TEST_LIBRARY_PATH, "validate", plugin};
}

std::vector<std::string> FaultyLibrary(const std::string& plugin) {
    return {"--library", ZEN_FAULTY_LIBRARY_PATH, "validate", plugin};
}

std::set<std::string> WithStatus(const nlohmann::json& plugin, const std::string& status) {
    std::set<std::string> ids;
    for (const auto& check : plugin["checks"])
        if (check["status"] == status) ids.insert(check["id"].get<std::string>());
    return ids;
}

std::string FailureLines(const nlohmann::json& report) {
    std::ostringstream lines;
    for (const auto& plugin : report["plugins"])
        for (const auto& check : plugin["checks"])
            if (check["status"] == "fail")
                lines << plugin["name"].get<std::string>() << ": " << check["id"].get<std::string>() << ": "
                      << check["reason"].get<std::string>() << "\n";
    return lines.str();
}

const nlohmann::json* FindCheck(const nlohmann::json& plugin, const std::string& id) {
    for (const auto& check : plugin["checks"])
        if (check["id"] == id) return &check;
    return nullptr;
}

}  // namespace

TEST(ZenfxValidate, EveryRegisteredPluginPasses) {
    const auto report = ValidateJson({"validate", "--all"}, 0);
    ASSERT_TRUE(report.is_object());
    EXPECT_TRUE(report["passed"].get<bool>()) << FailureLines(report);
    EXPECT_EQ(report["counts"]["fail"], 0);
    ASSERT_FALSE(report["plugins"].empty());
    for (const auto& plugin : report["plugins"]) {
        EXPECT_TRUE(plugin["passed"].get<bool>()) << plugin["name"];
        // The checks every plug-in with audio input gets, whatever it declares.
        const std::set<std::string> passed = WithStatus(plugin, "pass");
        for (const char* id : {"lifecycle.channel-layouts", "lifecycle.sample-rates", "parameters.set-get",
                               "parameters.state", "blocks.lengths", "signals.non-finite", "signals.huge",
                               "latency.bypass", "threads.parameters", "realtime.allocation", "realtime.locks"}) {
            // A plug-in without audio input (a sampler) has no input to feed these.
            const auto* check = FindCheck(plugin, id);
            if (check != nullptr && (*check)["status"] == "skip" && (*check)["reason"] == "no audio input") continue;
            EXPECT_EQ(passed.count(id), 1u) << plugin["name"] << " " << id;
        }
    }
}

TEST(ZenfxValidate, HealthyPluginWithLatencyPassesTheLatencyChecks) {
    const auto report = ValidateJson(TestLibrary("Test Delay"), 0);
    ASSERT_EQ(report["plugins"].size(), 1u);
    const auto& plugin = report["plugins"][0];
    EXPECT_TRUE(WithStatus(plugin, "fail").empty()) << FailureLines(report);
    const auto* impulse = FindCheck(plugin, "latency.impulse");
    ASSERT_NE(impulse, nullptr);
    EXPECT_EQ((*impulse)["status"], "pass");
    EXPECT_NE((*impulse)["reason"].get<std::string>().find("64 samples"), std::string::npos) << (*impulse)["reason"];
}

// Each faulty plug-in fails the check that watches for its fault, and only
// the checks its fault really breaks.
struct Fault {
    const char* plugin;
    std::set<std::string> failing;
    const char* reasonPart;  // in the first failing check's reason
};

void PrintTo(const Fault& fault, std::ostream* out) { *out << fault.plugin; }

class ZenfxValidateFault : public testing::TestWithParam<Fault> {};

TEST_P(ZenfxValidateFault, FailsTheMatchingCheck) {
    const Fault& fault = GetParam();
    const auto report = ValidateJson(FaultyLibrary(fault.plugin), 1);
    ASSERT_EQ(report["plugins"].size(), 1u);
    const auto& plugin = report["plugins"][0];
    EXPECT_FALSE(plugin["passed"].get<bool>());
    EXPECT_EQ(WithStatus(plugin, "fail"), fault.failing) << FailureLines(report);
    const auto* first = FindCheck(plugin, *fault.failing.begin());
    ASSERT_NE(first, nullptr);
    EXPECT_NE((*first)["reason"].get<std::string>().find(fault.reasonPart), std::string::npos) << (*first)["reason"];
}

INSTANTIATE_TEST_SUITE_P(
    Faults, ZenfxValidateFault,
    testing::Values(Fault{"Test Allocating", {"realtime.allocation"}, "allocations"},
                    // Dropping "Gain" also shows in the state and from another thread.
                    Fault{"Test Ignored Parameter",
                          {"parameters.set-get", "parameters.state", "threads.parameters"},
                          "'Gain' (index 0): set to -24, read back 0"},
                    Fault{"Test Wrong Latency", {"latency.impulse"}, "latency of 40 samples but an impulse comes out"},
                    Fault{"Test NaN State",
                          {"signals.non-finite"},
                          "after one sample of NaN on channel 1 at frame 2148 with the defaults at 48000 Hz: NaN at "
                          "frame 2148 on channel 1"},
                    Fault{"Test Overflow",
                          {"signals.huge"},
                          "after one sample of 1e+18 on channel 1 at frame 2148 with the defaults at 48000 Hz: +Inf at "
                          "frame 2148 on channel 1 (1 non-finite sample in all)"},
                    Fault{"Test Locking", {"realtime.locks"}, "does not declare LocksAudioPath"},
                    Fault{"Test Block Peak", {"blocks.split-invariance"}, "does not declare itself block-based"}),
    [](const testing::TestParamInfo<Fault>& param) {
        std::string name = param.param.plugin;
        name.erase(std::remove(name.begin(), name.end(), ' '), name.end());
        return name;
    });

TEST(ZenfxValidate, TextReportHasOneLinePerCheckWithItsReason) {
    auto args = FaultyLibrary("Test Wrong Latency");
    args.insert(args.end(), {"--level", kQuick, "--check", "latency", "--check", "lifecycle.reset"});
    const auto result = RunZenfx(args);
    EXPECT_EQ(result.exitCode, 1);
    std::istringstream lines(result.out);
    std::vector<std::string> checks;
    for (std::string line; std::getline(lines, line);)
        if (line.rfind("  ", 0) == 0) checks.push_back(line);
    ASSERT_EQ(checks.size(), 3u) << result.out;
    EXPECT_EQ(checks[0].find("  pass  lifecycle.reset"), 0u) << checks[0];
    EXPECT_EQ(checks[1].find("  fail  latency.impulse"), 0u) << checks[1];
    EXPECT_NE(checks[1].find("reports a latency of 40 samples but an impulse comes out of channel 1 32 samples late"),
              std::string::npos)
        << checks[1];
    EXPECT_EQ(checks[2].find("  pass  latency.bypass"), 0u) << checks[2];
    EXPECT_NE(result.out.find("Test Wrong Latency: 2 checks passed, 1 failed, 0 skipped"), std::string::npos)
        << result.out;
}

TEST(ZenfxValidate, ChecksOnlyWhatIsAsked) {
    const auto report = ValidateJson({"validate", "Soft Clipper", "--check", "parameters.bad", "--check", "realtime"}, 0);
    ASSERT_EQ(report["plugins"].size(), 1u);
    EXPECT_EQ(WithStatus(report["plugins"][0], "pass"),
              (std::set<std::string>{"parameters.bad-index", "realtime.allocation", "realtime.locks"}));
}

TEST(ZenfxValidate, UsageMistakesAreOneLineErrors) {
    for (const std::vector<std::string>& args :
         {std::vector<std::string>{"validate"}, {"validate", "--all", "Soft Clipper"}, {"validate", "--all", "--level", "0"},
          {"validate", "--all", "--level", "6"}}) {
        const auto result = RunZenfx(args);
        EXPECT_EQ(result.exitCode, 2) << args.back();
        EXPECT_EQ(std::count(result.err.begin(), result.err.end(), '\n'), 1) << result.err;
    }
    // A --check that matches nothing would pass by checking nothing.
    for (const char* check : {"nonexistent", "signal.huge"}) {
        const auto none = RunZenfx({"validate", "--all", "--check", "lifecycle", "--check", check});
        EXPECT_EQ(none.exitCode, 2) << none.out;
        EXPECT_EQ(std::count(none.err.begin(), none.err.end(), '\n'), 1) << none.err;
        EXPECT_NE(none.err.find(std::string("no check matches --check '") + check + "'"), std::string::npos)
            << none.err;
        EXPECT_TRUE(none.out.empty()) << none.out;
    }
    EXPECT_NE(RunZenfx({"validate", "--all", "--check", "signal.huge"}).err.find("did you mean 'signals.huge'"),
              std::string::npos);
    const auto unknown = RunZenfx({"validate", "Soft Clipr"});
    EXPECT_EQ(unknown.exitCode, 1);
    EXPECT_NE(unknown.err.find("did you mean 'Soft Clipper'"), std::string::npos) << unknown.err;
}

// Every template's chain builds and runs: all its actions go through and
// noise passes the chain as the template left it. (Each plug-in in a chain
// gets its battery in EveryRegisteredPluginPasses.)
TEST(ZenfxValidate, EveryTemplateChainPasses) {
    for (const char* name : {"AI_Dialog", "AI_Music", "AI_SFX", "AI_Ambience", "AI_VoiceOverRecording",
                             "AI_DialogAdvanced", "AI_LevelRider", "AI_Leveller", "AI_Master", "AI_DialogRider"}) {
        SCOPED_TRACE(name);
        const auto report = ValidateJson({"validate", "AI", "--template", name, "--check", "chain"}, 0);
        ASSERT_TRUE(report.is_object());
        EXPECT_TRUE(report["passed"].get<bool>()) << FailureLines(report);
        ASSERT_EQ(report["plugins"].size(), 1u);  // the battery is left out when only chain checks are asked
        EXPECT_EQ(report["counts"]["pass"], 2);
    }
    // A chain's plug-ins are validated too: AI_SFX loads the distortion and the reverb.
    const auto report = ValidateJson({"validate", "AI", "--template", "AI_SFX", "--check", "parameters.set-get",
                                      "--check", "chain"},
                                     0);
    ASSERT_TRUE(report.is_object());
    std::set<std::string> names;
    for (const auto& plugin : report["plugins"]) names.insert(plugin["name"].get<std::string>());
    EXPECT_EQ(names, (std::set<std::string>{"AI", "Distortion", "Reverb", "AI, AI_SFX chain"}));
    EXPECT_EQ(report["counts"]["fail"], 0) << FailureLines(report);
}
