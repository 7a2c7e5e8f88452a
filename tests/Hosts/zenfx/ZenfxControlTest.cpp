// zenfx control end to end: the console's documents listed, shown, changed
// and run, and every bad document refused with its place while the stored
// file stays as it was.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <fstream>
#include <nlohmann/json.hpp>
#include <sstream>

#include "ZenfxRunner.h"

using zentest::RunZenfx;
using zentest::TempFolder;

namespace {

std::string ReadText(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    std::stringstream text;
    text << in.rdbuf();
    return text.str();
}

std::vector<std::string> Control(const TempFolder& folder, std::vector<std::string> arguments) {
    arguments.insert(arguments.begin(), "control");
    arguments.insert(arguments.end(), {"--config-dir", folder / "config"});
    return arguments;
}

}  // namespace

TEST(ZenfxControl, ListsTheSixControlPluginsAndTheirDocuments) {
    TempFolder folder;
    const auto result = RunZenfx(Control(folder, {"list", "--json"}));
    ASSERT_EQ(result.exitCode, 0) << result.err;
    const auto rows = nlohmann::json::parse(result.out);
    std::vector<std::string> names, documents;
    for (const auto& row : rows) {
        names.push_back(row["name"]);
        documents.push_back(row["document"]);
        EXPECT_FALSE(row["stored"].get<bool>());
    }
    EXPECT_EQ(names, (std::vector<std::string>{"B-Chain Control", "I/O Interface Settings", "Performance Testing",
                                               "Remote Control Settings", "TalkbackSettings", "Test Tones Settings"}));
    EXPECT_EQ(documents, (std::vector<std::string>{"BChainSettings", "IOInterfaceSettings", "PerformanceTesting",
                                                   "RemoteControlSettings", "TalkbackSettings", "OscillatorSettings"}));
}

TEST(ZenfxControl, SetChangesTheStoredDocumentWhichShowReads) {
    TempFolder folder;
    const auto set =
        RunZenfx(Control(folder, {"set", "b-chain control", "channel2.delay=1.5ms", "channel2.polarity=inverted",
                                  "channel2.eq1=bell", "channel2.eq1Frequency=2.5kHz"}));
    ASSERT_EQ(set.exitCode, 0) << set.err;
    EXPECT_NE(set.out.find("channel2.eq1Frequency   2500 Hz\n"), std::string::npos) << set.out;
    const std::string stored = ReadText(folder / "config/BChainSettings.xml");
    EXPECT_NE(
        stored.find(
            "<Channel number=\"2\" gain=\"0\" delay=\"1.5\" polarity=\"inverted\" eq1=\"bell\" eq1Frequency=\"2500\""),
        std::string::npos)
        << stored;
    const auto show = RunZenfx(Control(folder, {"show", "B-Chain Control", "--json"}));
    ASSERT_EQ(show.exitCode, 0) << show.err;
    const auto shown = nlohmann::json::parse(show.out);
    EXPECT_TRUE(shown["stored"].get<bool>());
    EXPECT_EQ(shown["parameters"], 304);
    EXPECT_EQ(shown["settings"]["channel2.delay"], 1.5);
    EXPECT_EQ(shown["settings"]["channel2.polarity"], "inverted");
    EXPECT_EQ(shown["settings"]["channel1.polarity"], "normal");

    // Without --config-dir the documents live in the XDG config folder.
    const auto xdg =
        zentest::RunProgram(ZENFX_PATH, {"control", "set", "TalkbackSettings", "dim=-30", "destination1.output=2"},
                            {"XDG_CONFIG_HOME=" + (folder / "xdg")});
    ASSERT_EQ(xdg.exitCode, 0) << xdg.err;
    EXPECT_NE(ReadText(folder / "xdg/ZenAudioPlugins/TalkbackSettings.xml").find("dim=\"-30\""), std::string::npos);
}

TEST(ZenfxControl, BadDocumentsAndSettingsAreRefusedInOneLineAndTheStoredFileStays) {
    TempFolder folder;
    ASSERT_EQ(RunZenfx(Control(folder, {"set", "TalkbackSettings", "dim=-12"})).exitCode, 0);
    const std::string path = folder / "config/TalkbackSettings.xml";
    const std::string good = ReadText(path);
    struct Case {
        std::vector<std::string> arguments;
        std::string expected;
    };
    const Case settingMistakes[] = {
        {{"set", "TalkbackSettings", "dim=-70"}, "dim: -70 must be -60 to 0 dB"},
        {{"set", "TalkbackSettings", "dimm=-7"}, "'dimm' is no setting of TalkbackSettings"},
        {{"set", "TalkbackSettings", "destination1.output=3", "destination2.output=3"},
         "Destination 2: output 3 is listed twice"},
        {{"set", "TalkbackSettings", "mode"}, "'mode' is not KEY=VALUE"},
        {{"show", "Talkback Settings"}, "did you mean 'TalkbackSettings'"},
        {{"run", "TalkbackSettings"}, "has nothing to run"},
    };
    for (const Case& c : settingMistakes) {
        const auto result = RunZenfx(Control(folder, c.arguments));
        EXPECT_NE(result.exitCode, 0) << c.expected;
        EXPECT_EQ(std::count(result.err.begin(), result.err.end(), '\n'), 1) << result.err;
        EXPECT_NE(result.err.find(c.expected), std::string::npos) << result.err;
        EXPECT_EQ(ReadText(path), good) << c.expected;
    }
    const std::pair<std::string, std::string> badFiles[] = {
        {good.substr(0, good.size() - 30), path + ":"},
        {"<TalkbackSettings version=\"1\">\n  <Talkback dim=\"-12\">\n</TalkbackSettings>\n",
         path + ":3:3: malformed XML"},
        {"<TalkbackSettings>\n  <Speaker/>\n</TalkbackSettings>\n", path + ":2:4: unknown element <Speaker>"},
        {"<TalkbackSettings>\n  <Talkback dim=\"+3\"/>\n</TalkbackSettings>\n",
         path + ":2:4: Talkback: dim=\"+3\" must be -60 to 0 dB"},
    };
    for (const auto& [text, expected] : badFiles) {
        std::ofstream(path, std::ios::binary | std::ios::trunc) << text;
        for (const auto& arguments : {std::vector<std::string>{"show", "TalkbackSettings"},
                                      std::vector<std::string>{"set", "TalkbackSettings", "dim=-6"}}) {
            const auto result = RunZenfx(Control(folder, arguments));
            EXPECT_NE(result.exitCode, 0);
            EXPECT_EQ(std::count(result.err.begin(), result.err.end(), '\n'), 1) << result.err;
            EXPECT_EQ(result.err.rfind("zenfx: " + expected, 0), 0u) << result.err;
            EXPECT_EQ(ReadText(path), text);  // never replaced by anything half-read
        }
    }
    EXPECT_EQ(folder.Files().size(), 1u);  // the config folder alone: no temporary files left
}

TEST(ZenfxControl, RunsTestTonesIntoAFileAndThePerformanceTestAsJson) {
    TempFolder folder;
    ASSERT_EQ(RunZenfx(Control(folder, {"set", "Test Tones Settings", "level=-6", "duration=0.1", "channels=3",
                                        "channel=2", "sampleRate=44100"}))
                  .exitCode,
              0);
    const auto tones = RunZenfx(Control(folder, {"run", "Test Tones Settings", "-o", folder / "tone.wav"}));
    ASSERT_EQ(tones.exitCode, 0) << tones.err;
    const auto audio = zentest::ReadAudio(folder / "tone.wav");
    EXPECT_EQ(audio.info.samplerate, 44100);
    EXPECT_EQ(audio.info.channels, 3);
    EXPECT_EQ(audio.info.frames, 4410);
    const auto second = audio.Channel(1);
    EXPECT_NEAR(20.0 * std::log10(*std::max_element(second.begin(), second.end())), -6.0, 0.01);
    EXPECT_EQ(audio.Channel(0), std::vector<float>(4410, 0.0f));

    ASSERT_EQ(RunZenfx(Control(folder, {"set", "Performance Testing", "plugins=Soft Clipper, limiter", "duration=0.2",
                                        "blockSize=256"}))
                  .exitCode,
              0);
    const auto run = RunZenfx(Control(folder, {"run", "Performance Testing", "--json"}));
    ASSERT_EQ(run.exitCode, 0) << run.err;
    const auto table = nlohmann::json::parse(run.out);
    EXPECT_EQ(table["blockSize"], 256);
    ASSERT_EQ(table["plugins"].size(), 2u);
    EXPECT_EQ(table["plugins"][0]["name"], "Limiter");
    EXPECT_EQ(table["plugins"][1]["name"], "Soft Clipper");
    for (const auto& row : table["plugins"]) {
        EXPECT_GT(row["realtime"].get<double>(), 1.0) << row.dump();
        EXPECT_NEAR(row["cpuLoad"].get<double>() * row["realtime"].get<double>(), 100.0, 1e-6);
    }
    const auto text = RunZenfx(Control(folder, {"run", "Performance Testing"}));
    EXPECT_NE(text.out.find("PLUG-IN"), std::string::npos);
    EXPECT_NE(text.out.find("Soft Clipper"), std::string::npos);
}
