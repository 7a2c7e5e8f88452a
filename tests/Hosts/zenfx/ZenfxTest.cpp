// zenfx end to end: the commands a user types, on small generated files.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <fstream>
#include <nlohmann/json.hpp>

#include "ZenfxRunner.h"

using zentest::ReadAudio;
using zentest::RunZenfx;
using zentest::TempFolder;
using zentest::WriteAudio;

namespace {

constexpr int kRate = 48000;

std::vector<float> Ramp(std::size_t frames, float amplitude) {
    std::vector<float> x(frames);
    for (std::size_t n = 0; n < frames; ++n)
        x[n] = amplitude * std::sin(0.01f * static_cast<float>(n)) * (0.5f + 0.5f * std::cos(0.0007f * n));
    return x;
}

std::size_t Lines(const std::string& text) { return static_cast<std::size_t>(std::count(text.begin(), text.end(), '\n')); }

// A failure: non-zero exit, one line on stderr containing `expected`, and
// nothing left in the folder but the files that were there before.
void ExpectCleanFailure(const zentest::ZenfxResult& result, const std::string& expected, const TempFolder& folder,
                        std::size_t filesBefore) {
    EXPECT_NE(result.exitCode, 0);
    EXPECT_EQ(Lines(result.err), 1u) << result.err;
    EXPECT_NE(result.err.find(expected), std::string::npos) << result.err;
    EXPECT_EQ(folder.Files().size(), filesBefore) << "a partial or temporary file was left behind";
}

}  // namespace

TEST(ZenfxList, ShowsEveryPluginWithKeyCodeAndLimits) {
    auto text = RunZenfx({"list"});
    ASSERT_EQ(text.exitCode, 0) << text.err;
    EXPECT_NE(text.out.find("Soft Clipper:1517179747"), std::string::npos);
    EXPECT_NE(text.out.find("ZnSc"), std::string::npos);
    EXPECT_NE(text.out.find("ZenSoftClipper"), std::string::npos);

    auto json = RunZenfx({"list", "--json"});
    ASSERT_EQ(json.exitCode, 0);
    const auto rows = nlohmann::json::parse(json.out);
    const auto clipper = std::find_if(rows.begin(), rows.end(), [](const auto& r) { return r["name"] == "Soft Clipper"; });
    ASSERT_NE(clipper, rows.end());
    EXPECT_EQ((*clipper)["kind"], "audio");
    EXPECT_EQ((*clipper)["key"], "Soft Clipper:1517179747");
    EXPECT_EQ((*clipper)["code"], "ZnSc");
    EXPECT_EQ((*clipper)["codeDecimal"], 1517179747);
    EXPECT_EQ((*clipper)["version"], 1.0);
    EXPECT_EQ((*clipper)["inputs"], 32);
    EXPECT_EQ((*clipper)["outputs"], 32);
    EXPECT_EQ((*clipper)["class"], "ZenSoftClipper");
    EXPECT_EQ((*clipper)["listFlags"], 0);
}

TEST(ZenfxInfo, FindsPluginsByNameOrKeyIgnoringCase) {
    for (const char* name : {"soft clipper", "SOFT CLIPPER", "Soft Clipper:1517179747"}) {
        auto result = RunZenfx({"info", name, "--json"});
        ASSERT_EQ(result.exitCode, 0) << name << result.err;
        const auto info = nlohmann::json::parse(result.out);
        EXPECT_EQ(info["latency"], 0);
        EXPECT_EQ(info["tail"], 0);
        EXPECT_EQ(info["blockBased"], false);
        EXPECT_EQ(info["locksAudioPath"], false);
        ASSERT_EQ(info["parameters"].size(), 3u);
        EXPECT_EQ(info["parameters"][0]["identifier"], "ZenSoftClipper::THRESHOLD");
        EXPECT_EQ(info["parameters"][0]["unit"], "dB");
        EXPECT_EQ(info["parameters"][2]["label"], "Output Level");
        EXPECT_EQ(info["meters"].size(), 5u);
    }
    auto text = RunZenfx({"info", "Soft Clipper"});
    EXPECT_NE(text.out.find("-18 to 18 dB"), std::string::npos);
    EXPECT_NE(text.out.find("Warm Drive"), std::string::npos);
}

TEST(ZenfxProcess, RunsTheChainInOrderWithEachSettingOnItsPlugin) {
    TempFolder folder;
    const std::vector<float> input = Ramp(3000, 0.9f);
    WriteAudio(folder / "in.wav", {input}, kRate);
    auto result = RunZenfx({"process", folder / "in.wav", "-o", folder / "out.wav", "--plugin", "Soft Clipper",
                            "--set", "Threshold=-6 dB", "--set", "ZenSoftClipper::SHAPE=0", "--plugin",
                            "soft clipper:1517179747", "--set", "output level=-6"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    EXPECT_TRUE(result.err.empty()) << result.err;  // no progress bar when not on a terminal
    const float knee = std::pow(10.0f, -6.0f / 20.0f);
    const auto out = ReadAudio(folder / "out.wav");
    ASSERT_EQ(out.samples.size(), input.size());
    for (std::size_t n = 0; n < input.size(); ++n) {
        const float clipped = std::max(-knee, std::min(knee, input[n]));
        ASSERT_NEAR(out.samples[n], clipped * knee, 2e-6) << n;
    }
}

TEST(ZenfxProcess, BlockSizeDoesNotChangeTheResult) {
    TempFolder folder;
    WriteAudio(folder / "in.wav", {Ramp(5001, 1.5f), Ramp(5001, -0.7f)}, kRate);
    std::vector<std::vector<float>> outputs;
    for (const char* block : {"1", "512", "4096"}) {
        const std::string out = folder / (std::string("out") + block + ".wav");
        auto result = RunZenfx({"process", folder / "in.wav", "-o", out, "--block", block, "--plugin", "Soft Clipper",
                                "--set", "Threshold=4.5", "--set", "Shape=0.4"});
        ASSERT_EQ(result.exitCode, 0) << result.err;
        outputs.push_back(ReadAudio(out).samples);
    }
    EXPECT_EQ(outputs[0], outputs[1]);
    EXPECT_EQ(outputs[1], outputs[2]);
}

TEST(ZenfxProcess, CompensatesTheChainLatency) {
    TempFolder folder;
    const std::vector<float> input = Ramp(2001, 0.5f);
    WriteAudio(folder / "in.wav", {input, input}, kRate);
    // "Test Delay" lives only in the test copy of the library.
    const std::vector<std::string> chain = {"--library", ZEN_TEST_LIBRARY_PATH, "process", folder / "in.wav", "-o",
                                            "", "--plugin", "Test Delay", "--set", "Delay=100", "--plugin",
                                            "Test Delay", "--set", "Delay=37", "--plugin", "Soft Clipper"};
    auto compensated = chain;
    compensated[5] = folder / "aligned.wav";
    auto result = RunZenfx(compensated);
    ASSERT_EQ(result.exitCode, 0) << result.err;
    EXPECT_NE(result.out.find("latency 137 samples, compensated"), std::string::npos) << result.out;
    EXPECT_EQ(ReadAudio(folder / "aligned.wav").Channel(1), input);

    auto raw = chain;
    raw[5] = folder / "raw.wav";
    raw.push_back("--no-latency-compensation");
    ASSERT_EQ(RunZenfx(raw).exitCode, 0);
    const auto delayed = ReadAudio(folder / "raw.wav").Channel(0);
    ASSERT_EQ(delayed.size(), input.size());
    for (std::size_t n = 0; n < input.size(); ++n) ASSERT_EQ(delayed[n], n < 137 ? 0.0f : input[n - 137]) << n;
}

TEST(ZenfxProcess, KeepsRateChannelsLengthAndSampleFormat) {
    TempFolder folder;
    const std::vector<float> input = Ramp(1001, 0.3f);
    struct Case {
        const char* in;
        int inFormat;
        const char* out;
        const char* option;
        int expected;
    } cases[] = {
        {"f.wav", SF_FORMAT_WAV | SF_FORMAT_FLOAT, "f-out.wav", "", SF_FORMAT_WAV | SF_FORMAT_FLOAT},
        {"p.wav", SF_FORMAT_WAV | SF_FORMAT_PCM_24, "p-out.wav", "", SF_FORMAT_WAV | SF_FORMAT_PCM_24},
        {"f2.wav", SF_FORMAT_WAV | SF_FORMAT_FLOAT, "f2-out.wav", "pcm16", SF_FORMAT_WAV | SF_FORMAT_PCM_16},
        {"a.aiff", SF_FORMAT_AIFF | SF_FORMAT_PCM_16, "a-out.flac", "", SF_FORMAT_FLAC | SF_FORMAT_PCM_16},
        {"l.flac", SF_FORMAT_FLAC | SF_FORMAT_PCM_24, "l-out.aiff", "", SF_FORMAT_AIFF | SF_FORMAT_PCM_24},
        {"f3.wav", SF_FORMAT_WAV | SF_FORMAT_FLOAT, "f3-out.flac", "", SF_FORMAT_FLAC | SF_FORMAT_PCM_24},
    };
    for (const Case& c : cases) {
        WriteAudio(folder / c.in, {input, input, input}, 44100, c.inFormat);
        std::vector<std::string> args = {"process", folder / c.in, "-o", folder / c.out, "--plugin", "Soft Clipper"};
        if (*c.option) args.insert(args.end(), {"--format", c.option});
        auto result = RunZenfx(args);
        ASSERT_EQ(result.exitCode, 0) << c.in << result.err;
        const auto out = ReadAudio(folder / c.out);
        EXPECT_EQ(out.info.format, c.expected) << c.out;
        EXPECT_EQ(out.info.samplerate, 44100);
        EXPECT_EQ(out.info.channels, 3);
        EXPECT_EQ(out.info.frames, 1001);
        EXPECT_NEAR(out.samples[3 * 500], input[500], 1e-4) << c.out;
    }
}

TEST(ZenfxProcess, DemoMaterialWhenNoInputIsGiven) {
    TempFolder folder;
    auto result = RunZenfx({"process", "-o", folder / "demo.wav", "--plugin", "Soft Clipper", "--set",
                            "Threshold=6", "--meters-json", folder / "meters.json"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    EXPECT_NE(result.out.find("demo material"), std::string::npos);
    const auto out = ReadAudio(folder / "demo.wav");
    EXPECT_EQ(out.info.channels, 2);
    EXPECT_EQ(out.info.frames, 6 * kRate);
    EXPECT_EQ(out.info.format, SF_FORMAT_WAV | SF_FORMAT_FLOAT);
    const float peak = *std::max_element(out.samples.begin(), out.samples.end());
    EXPECT_GT(peak, 0.9f);    // driven +6 dB from -3 dBFS peaks
    EXPECT_LT(peak, 1.32f);   // and rounded below the curve's ceiling

    std::ifstream meters(folder / "meters.json");
    const auto json = nlohmann::json::parse(meters);
    ASSERT_EQ(json["plugins"].size(), 1u);
    EXPECT_EQ(json["plugins"][0]["name"], "Soft Clipper");
    EXPECT_EQ(json["plugins"][0]["meters"].size(), 5u);
    EXPECT_EQ(json["plugins"][0]["meters"][1]["name"], "Input Peak 1");
}

TEST(ZenfxProcess, PresetsThenSettings) {
    TempFolder folder;
    WriteAudio(folder / "in.wav", {std::vector<float>(100, 2.0f)}, kRate);
    auto result = RunZenfx({"process", folder / "in.wav", "-o", folder / "out.wav", "--plugin", "Soft Clipper",
                            "--preset", "hard clip -1 dB", "--set", "Output Level=-1"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    const float knee = std::pow(10.0f, -1.0f / 20.0f);
    EXPECT_NEAR(ReadAudio(folder / "out.wav").samples[50], knee * knee, 1e-6);
}

TEST(ZenfxErrors, UnknownPluginSuggestsTheClosest) {
    TempFolder folder;
    auto result = RunZenfx({"process", "-o", folder / "out.wav", "--plugin", "Soft Cliper"});
    ExpectCleanFailure(result, "did you mean 'Soft Clipper'", folder, 0);
    ExpectCleanFailure(RunZenfx({"info", "Sft Clipper"}), "did you mean 'Soft Clipper'", folder, 0);
}

TEST(ZenfxErrors, UnknownParameterSuggestsTheClosest) {
    TempFolder folder;
    auto result = RunZenfx({"process", "-o", folder / "out.wav", "--plugin", "Soft Clipper", "--set", "Treshold=3"});
    ExpectCleanFailure(result, "did you mean 'Threshold'", folder, 0);
}

TEST(ZenfxErrors, ValuesOutOfRangeSayTheRange) {
    TempFolder folder;
    ExpectCleanFailure(RunZenfx({"process", "-o", folder / "o.wav", "--plugin", "Soft Clipper", "--set",
                                 "Threshold=30"}),
                       "out of range (-18 to 18 dB)", folder, 0);
    ExpectCleanFailure(RunZenfx({"process", "-o", folder / "o.wav", "--plugin", "Soft Clipper", "--set",
                                 "Threshold=loud"}),
                       "not a value", folder, 0);
    ExpectCleanFailure(RunZenfx({"process", "-o", folder / "o.wav", "--plugin", "Soft Clipper", "--set",
                                 "Threshold=3 Hz"}),
                       "takes dB", folder, 0);
}

TEST(ZenfxErrors, UnreadableAndUnsupportedFiles) {
    TempFolder folder;
    ExpectCleanFailure(RunZenfx({"process", folder / "missing.wav", "-o", folder / "o.wav", "--plugin",
                                 "Soft Clipper"}),
                       "cannot read", folder, 0);
    std::ofstream(folder / "text.wav") << "this is not audio\n";
    ExpectCleanFailure(RunZenfx({"process", folder / "text.wav", "-o", folder / "o.wav", "--plugin",
                                 "Soft Clipper"}),
                       "cannot read", folder, 1);
    ExpectCleanFailure(RunZenfx({"process", "-o", folder / "o.mp3", "--plugin", "Soft Clipper"}),
                       "unknown file type", folder, 1);
    ExpectCleanFailure(RunZenfx({"process", "-o", folder / "o.flac", "--format", "float", "--plugin",
                                 "Soft Clipper"}),
                       "cannot hold float", folder, 1);
}

TEST(ZenfxErrors, RefusedChannelCountNamesWhatThePluginTakes) {
    TempFolder folder;
    const std::vector<float> x(64, 0.1f);
    WriteAudio(folder / "three.wav", {x, x, x}, kRate);
    auto result = RunZenfx({"--library", ZEN_TEST_LIBRARY_PATH, "process", folder / "three.wav", "-o",
                            folder / "o.wav", "--plugin", "Test Delay"});
    ExpectCleanFailure(result, "'Test Delay' does not accept 3 channels (it takes 1 or 2)", folder, 1);
}

TEST(ZenfxErrors, OutputMayNotBeTheInput) {
    TempFolder folder;
    const std::vector<float> x = Ramp(100, 0.5f);
    WriteAudio(folder / "in.wav", {x}, kRate);
    ExpectCleanFailure(RunZenfx({"process", folder / "in.wav", "-o", folder / "in.wav", "--plugin",
                                 "Soft Clipper"}),
                       "is the input file", folder, 1);
    ExpectCleanFailure(RunZenfx({"process", folder / "in.wav", "-o", folder / "./in.wav", "--plugin",
                                 "Soft Clipper"}),
                       "is the input file", folder, 1);
    EXPECT_EQ(ReadAudio(folder / "in.wav").samples, x);
}

TEST(ZenfxErrors, AFailedRunLeavesAnExistingOutputAlone) {
    TempFolder folder;
    const std::vector<float> x = Ramp(100, 0.5f);
    WriteAudio(folder / "out.wav", {x}, kRate);
    auto result = RunZenfx({"process", "-o", folder / "out.wav", "--plugin", "Soft Clipper", "--set", "Shape=7"});
    ExpectCleanFailure(result, "out of range", folder, 1);
    EXPECT_EQ(ReadAudio(folder / "out.wav").samples, x);
}

TEST(ZenfxErrors, UsageMistakes) {
    TempFolder folder;
    ExpectCleanFailure(RunZenfx({"process", "--set", "a=1", "-o", folder / "o.wav", "--plugin", "Soft Clipper"}),
                       "comes before any --plugin", folder, 0);
    ExpectCleanFailure(RunZenfx({"process", "-o", folder / "o.wav"}), "at least one --plugin", folder, 0);
    ExpectCleanFailure(RunZenfx({"process", "--plugin", "Soft Clipper"}), "--output", folder, 0);
    ExpectCleanFailure(RunZenfx({"frobnicate"}), "zenfx", folder, 0);
}
