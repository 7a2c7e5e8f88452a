// zenfx end to end: the commands a user types, on small generated files.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <fstream>
#include <iterator>
#include <set>
#include <sstream>
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

// Every field of `expected` (JSON text) has that value in `actual`.
void ExpectFields(const nlohmann::json& actual, const char* expected) {
    const nlohmann::json fields = nlohmann::json::parse(expected);
    for (const auto& [key, value] : fields.items()) EXPECT_EQ(actual.value(key, nlohmann::json()), value) << key;
}

std::size_t Lines(const std::string& text) { return static_cast<std::size_t>(std::count(text.begin(), text.end(), '\n')); }

}  // namespace

TEST(ZenfxList, ShowsEveryPluginWithKeyCodeAndLimits) {
    auto text = RunZenfx({"list"});
    ASSERT_EQ(text.exitCode, 0) << text.err;
    for (const char* part : {"Soft Clipper:1517179747", "ZnSc", "ZenSoftClipper", "De-Esser:1516596851"})
        EXPECT_NE(text.out.find(part), std::string::npos) << part;

    auto json = RunZenfx({"list", "--json"});
    ASSERT_EQ(json.exitCode, 0);
    const auto rows = nlohmann::json::parse(json.out);
    const auto clipper = std::find_if(rows.begin(), rows.end(), [](const auto& r) { return r["name"] == "Soft Clipper"; });
    ASSERT_NE(clipper, rows.end());
    ExpectFields(*clipper, R"({"kind": "audio", "key": "Soft Clipper:1517179747", "code": "ZnSc",
        "codeDecimal": 1517179747, "version": 1.0, "inputs": 32, "outputs": 32, "class": "ZenSoftClipper",
        "listFlags": 0})");
}

TEST(ZenfxInfo, FindsPluginsByNameOrKeyIgnoringCase) {
    for (const char* name : {"soft clipper", "SOFT CLIPPER", "Soft Clipper:1517179747"}) {
        auto result = RunZenfx({"info", name, "--json"});
        ASSERT_EQ(result.exitCode, 0) << name << result.err;
        const auto info = nlohmann::json::parse(result.out);
        ExpectFields(info, R"({"latency": 0, "tail": 0, "blockBased": false, "locksAudioPath": false})");
        ASSERT_EQ(info["parameters"].size(), 3u);
        ExpectFields(info["parameters"][0], R"({"identifier": "ZenSoftClipper::THRESHOLD", "unit": "dB"})");
        EXPECT_EQ(info["parameters"][2]["label"], "Output Level");
        EXPECT_EQ(info["meters"].size(), 5u);
    }
}

// Columns line up in characters ("m²" is one column for two bytes), and
// the text says which unit a plain number is in.
TEST(ZenfxInfo, TextShowsEachParameterWithItsUnitAndRangeAndThePresets) {
    auto clipper = RunZenfx({"info", "Soft Clipper"});
    EXPECT_NE(clipper.out.find("-18 to 18 dB"), std::string::npos);
    EXPECT_NE(clipper.out.find("Warm Drive"), std::string::npos);
    EXPECT_NE(clipper.out.find("Threshold=0 and Threshold=0dB are both 0 dB"), std::string::npos) << clipper.out;
    auto reverb = RunZenfx({"info", "Reverb"});
    ASSERT_EQ(reverb.exitCode, 0) << reverb.err;
    for (const char* line : {"Reverb:1517179490", "ZnRb", "T@-60dB", "0.1 to 20 s", "0 to 200 ms", "1 to 100 m",
                             "20 to 2000 Hz", "0 to 100 %", "Late Rev. Gain", "1 to 10000 m²",
                             "Brightness=50 and Brightness=50% are both 50 %"})
        EXPECT_NE(reverb.out.find(line), std::string::npos) << line;
    std::istringstream lines(reverb.out);
    std::set<std::size_t> columns;
    for (std::string line; std::getline(lines, line);) {
        const std::size_t at = line.find(" default ");
        if (at == std::string::npos) continue;
        // Characters before it: UTF-8 continuation bytes take no column.
        columns.insert(static_cast<std::size_t>(
            std::count_if(line.begin(), line.begin() + static_cast<std::ptrdiff_t>(at),
                          [](char c) { return (static_cast<unsigned char>(c) & 0xC0) != 0x80; })));
    }
    EXPECT_EQ(columns.size(), 1u) << reverb.out;
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

// --template chooses the "AI" plug-in's template; its controls load their
// target right after it and set it, and zenfx prints the chain and every
// integer sent with the value it became.
TEST(ZenfxProcess, TemplateLoadsItsTargetAndPrintsTheChainAndEveryValueItSet) {
    TempFolder folder;
    WriteAudio(folder / "in.wav", {Ramp(4800, 0.3f), Ramp(4800, 0.3f)}, kRate);
    const auto result = RunZenfx({"process", folder / "in.wav", "-o", folder / "out.wav", "--plugin", "AI",
                                  "--template", "AI_Dialog", "--set", "Cleanup=1", "--set", "CleanUpAmount=1"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    for (const char* line : {"zenfx:   0  AI\n", "zenfx:   1  Dialogue Processor\n",
                             "Dialogue Processor: Rumble Filt 10 -> on", "Dialogue Processor: Expander 10 -> on",
                             "Dialogue Processor: De-Pop Amount 8 -> 0.8", "Dialogue Processor: De-Ess Amount 6 -> 0.6",
                             "Dialogue Processor: Exp Amount 5 -> 0.5", "Dialogue Processor: Exp Speed 10000 -> 1000"})
        EXPECT_NE(result.out.find(line), std::string::npos) << line << "\n" << result.out;
    EXPECT_EQ(ReadAudio(folder / "out.wav").samples.size(), 9600u);

    const auto refused = RunZenfx({"process", folder / "in.wav", "-o", folder / "out2.wav", "--plugin", "Limiter",
                                   "--template", "AI_Dialog"});
    EXPECT_EQ(refused.exitCode, 2);
    EXPECT_NE(refused.err.find("'Limiter' has no templates"), std::string::npos) << refused.err;
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
        {"f2.wav", SF_FORMAT_WAV | SF_FORMAT_FLOAT, "f2-out.wav", "PCM16", SF_FORMAT_WAV | SF_FORMAT_PCM_16},
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
    ExpectFields(json["plugins"][0]["meters"][1],
                 R"({"identifier": "ZenSoftClipper::INPUT_PEAK_1", "name": "Input Peak 1", "kind": "level"})");
}

TEST(ZenfxProcess, MetersOfEveryKindMapToJson) {
    TempFolder folder;
    const std::vector<float> input = Ramp(1024, 0.5f);  // two whole blocks
    WriteAudio(folder / "in.wav", {input}, kRate);
    auto result = RunZenfx({"--library", ZEN_TEST_LIBRARY_PATH, "process", folder / "in.wav", "-o",
                            folder / "out.wav", "--no-latency-compensation", "--plugin", "Test Delay", "--set",
                            "Delay=0", "--meters-json", folder / "meters.json"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    std::ifstream file(folder / "meters.json");
    const auto meters = nlohmann::json::parse(file)["plugins"][0]["meters"];
    ASSERT_EQ(meters.size(), 3u);  // mono: one output peak, the array, the ring
    ExpectFields(meters[0], R"({"identifier": "ZenTestDelay::OUTPUT_PEAK_1", "kind": "level"})");
    EXPECT_TRUE(meters[0]["final"].is_number());
    EXPECT_TRUE(meters[0]["max"].is_number());
    ExpectFields(meters[1], R"({"identifier": "ZenTestDelay::LAST_SAMPLES", "kind": "array"})");
    EXPECT_EQ(meters[1]["final"].get<std::vector<float>>(), std::vector<float>(input.end() - 8, input.end()));
    EXPECT_FALSE(meters[1].contains("max"));
    ExpectFields(meters[2], R"({"identifier": "ZenTestDelay::POINTS", "kind": "ring", "final": null})");

    auto info = RunZenfx({"--library", ZEN_TEST_LIBRARY_PATH, "info", "Test Delay", "--json"});
    ASSERT_EQ(info.exitCode, 0) << info.err;
    const auto described = nlohmann::json::parse(info.out)["meters"];
    ExpectFields(described[2], R"({"kind": "array", "size": 8})");
    ExpectFields(described[3], R"({"kind": "ring", "size": 2, "capacity": 256})");
    auto text = RunZenfx({"--library", ZEN_TEST_LIBRARY_PATH, "info", "Test Delay"});
    EXPECT_NE(text.out.find("Points (ring of 256 x 2)"), std::string::npos) << text.out;
}

// A file run reports each level meter's highest reading, not only the last
// block's: a loud start, a quiet end and a latency flush of silence.
TEST(ZenfxProcess, MetersOfAFileRunAreTheFinalReadingsAndTheLevelsMaxima) {
    TempFolder folder;
    std::vector<float> input = Ramp(48000, 0.01f);
    for (std::size_t n = 0; n < 512; ++n) input[n] = n % 2 == 0 ? 0.5f : -0.5f;
    WriteAudio(folder / "in.wav", {input}, kRate);
    auto result = RunZenfx({"--library", ZEN_TEST_LIBRARY_PATH, "process", folder / "in.wav", "-o",
                            folder / "out.wav", "--plugin", "Test Delay", "--set", "Delay=100", "--meters-json",
                            folder / "meters.json"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    std::ifstream file(folder / "meters.json");
    const auto peak = nlohmann::json::parse(file)["plugins"][0]["meters"][0];
    ExpectFields(peak, R"({"identifier": "ZenTestDelay::OUTPUT_PEAK_1", "kind": "level", "unit": "dBFS"})");
    EXPECT_NEAR(peak["max"].get<double>(), -6.02, 0.01);
    EXPECT_LT(peak["final"].get<double>(), -40.0);  // the flush: the quiet end, then silence
}

// "Meter" at the end of the chain gives the output file's loudness: its
// integrated value at the end of the run, not the last block's.
TEST(ZenfxProcess, MeterAtTheEndGivesTheFilesLoudness) {
    TempFolder folder;
    // 1 kHz at amplitude 0.1 for 3 s: -23.0 LUFS.
    std::vector<float> tone(3 * kRate);
    for (std::size_t n = 0; n < tone.size(); ++n) tone[n] = 0.1f * std::sin(2.0f * 3.14159265f * 1000.0f * n / kRate);
    WriteAudio(folder / "in.wav", {tone}, kRate);
    auto result = RunZenfx({"process", folder / "in.wav", "-o", folder / "out.wav", "--plugin", "Meter",
                            "--meters-json", folder / "meters.json"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    std::ifstream file(folder / "meters.json");
    const auto meters = nlohmann::json::parse(file)["plugins"][0]["meters"];
    const auto integrated = std::find_if(meters.begin(), meters.end(),
                                         [](const auto& m) { return m["identifier"] == "ZenMeter::INTEGRATED"; });
    ASSERT_NE(integrated, meters.end());
    EXPECT_NEAR((*integrated)["final"].get<double>(), -23.0, 0.05);
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

// Each surprise is a one-line warning on stderr; the run still succeeds.
TEST(ZenfxProcess, WarnsWhereAValueIsSilentlyDiscardedOrLikelyNotMeant) {
    TempFolder folder;
    WriteAudio(folder / "in.wav", {Ramp(1000, 0.5f)}, kRate);
    const auto warnings = [&](std::vector<std::string> settings, const std::string& input = "") {
        std::vector<std::string> args = {"process", input.empty() ? folder / "in.wav" : input, "-o",
                                         folder / "out.wav", "--plugin"};
        args.insert(args.end(), settings.begin(), settings.end());
        const auto result = RunZenfx(args);
        EXPECT_EQ(result.exitCode, 0) << result.err;
        return result.err;
    };
    EXPECT_EQ(warnings({"Soft Clipper", "--set", "Threshold=3", "--set", "threshold=4"}),
              "zenfx: warning: --set 'threshold=4' for 'Soft Clipper' replaces the earlier --set 'Threshold=3'\n");
    EXPECT_EQ(warnings({"Soft Clipper", "--set", "Shape=0.2", "--preset", "Warm Drive"}),
              "zenfx: warning: --preset 'Warm Drive' for 'Soft Clipper' replaces the earlier --set 'Shape=0.2' (a "
              "--set after the --preset changes the preset's value)\n");
    EXPECT_EQ(warnings({"Soft Clipper", "--preset", "Warm Drive", "--set", "Shape=0.2"}), "");
    EXPECT_EQ(warnings({"De-Esser", "--set", "Amount=0.5"}),
              "zenfx: warning: --set 'Amount=0.5' for 'De-Esser' is 0.5 %; for 50 % write Amount=50%\n");
    EXPECT_EQ(warnings({"De-Esser", "--set", "Amount=50%"}), "");

    // A WAV file cut off in its data: the frames found and declared.
    const std::string whole = folder / "whole.wav", cut = folder / "cut.wav";
    WriteAudio(whole, {Ramp(1000, 0.5f)}, kRate, SF_FORMAT_WAV | SF_FORMAT_PCM_16);
    std::ifstream in(whole, std::ios::binary);
    std::string bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
    std::ofstream(cut, std::ios::binary) << bytes.substr(0, bytes.size() - 2 * 400);
    EXPECT_EQ(warnings({"Soft Clipper"}, cut),
              "zenfx: warning: '" + cut + "' is cut off: its header declares 1000 frames, the file holds 600; "
              "processing those\n");
    EXPECT_EQ(warnings({"Soft Clipper"}, whole), "");
}

TEST(ZenfxProcess, ValuesTakeUnitsAndChoicesAndLabelsWinOverUpperCaseNames) {
    TempFolder folder;
    auto deessed = RunZenfx({"process", "-o", folder / "out.wav", "--plugin", "De-Esser", "--set", "Frequency=6kHz",
                             "--set", "Range=Wide", "--set", "Amount=80%", "--meters-json", folder / "meters.json"});
    ASSERT_EQ(deessed.exitCode, 0) << deessed.err;
    std::ifstream file(folder / "meters.json");
    const auto meters = nlohmann::json::parse(file)["plugins"][0]["meters"];
    ASSERT_EQ(meters.size(), 2u);
    ExpectFields(meters[0], R"({"name": "Reduction", "unit": "dB"})");
    EXPECT_LE(meters[0]["final"].get<double>(), 0.5);
    EXPECT_GT(meters[0]["final"].get<double>(), -20.0);
    // "Range" is the De-Esser's band shape, "ZenDeesser::RANGE" its frequency.
    auto mixed = RunZenfx({"process", "-o", folder / "out2.wav", "--plugin", "De-Esser", "--set", "range=HF", "--set",
                           "ZenDeesser::RANGE=5k"});
    EXPECT_EQ(mixed.exitCode, 0) << mixed.err;

    // Seconds and milliseconds at 96 kHz: nothing before the 20 ms pre-delay, a tail half a second on.
    std::vector<float> click(96000, 0.0f);
    click[100] = 0.9f;
    WriteAudio(folder / "click.wav", {click}, 96000);
    auto reverb = RunZenfx({"process", folder / "click.wav", "-o", folder / "wet.wav", "--plugin", "Reverb", "--set",
                            "T@-60dB=2s", "--set", "Pre-Delay=20ms", "--set", "Dry/Wet=100%"});
    ASSERT_EQ(reverb.exitCode, 0) << reverb.err;
    const auto wet = ReadAudio(folder / "wet.wav").samples;
    ASSERT_EQ(wet.size(), click.size());
    const auto peak = [&](std::size_t from, std::size_t to) {
        return std::fabs(*std::max_element(wet.begin() + from, wet.begin() + to,
                                           [](float a, float b) { return std::fabs(a) < std::fabs(b); }));
    };
    EXPECT_LT(peak(0, 100 + 96000 / 50), 1e-4f);
    EXPECT_GT(peak(48000, 96000), 1e-4f);
}

// Each mistake: a non-zero exit, one line on stderr saying what is wrong,
// no partial or temporary file left, and the files that were there intact.
class ZenfxErrors : public testing::Test {
protected:
    using Mistakes = std::vector<std::pair<std::vector<std::string>, std::string>>;

    void SetUp() override {
        WriteAudio(in, {x}, kRate);
        WriteAudio(folder / "out.wav", {x}, kRate);
        WriteAudio(folder / "three.wav", {x, x, x}, kRate);
        WriteAudio(folder / "fast.wav", {x}, 768000);
        std::ofstream(folder / "text.wav") << "this is not audio\n";
    }

    void ExpectEach(const Mistakes& mistakes) {
        for (const auto& [args, expected] : mistakes) {
            const auto result = RunZenfx(args);
            EXPECT_NE(result.exitCode, 0) << expected;
            EXPECT_EQ(Lines(result.err), 1u) << result.err;
            EXPECT_NE(result.err.find(expected), std::string::npos) << result.err;
            EXPECT_EQ(folder.Files().size(), 5u) << expected << ": a partial or temporary file was left behind";
        }
        EXPECT_EQ(ReadAudio(in).samples, x);
        EXPECT_EQ(ReadAudio(folder / "out.wav").samples, x);
    }

    // `head`, then "--plugin Soft Clipper", then `tail`.
    static std::vector<std::string> Clipper(std::vector<std::string> head, const std::vector<std::string>& tail = {}) {
        head.insert(head.end(), {"--plugin", "Soft Clipper"});
        head.insert(head.end(), tail.begin(), tail.end());
        return head;
    }

    TempFolder folder;
    const std::vector<float> x = Ramp(100, 0.5f);
    const std::string in = folder / "in.wav", o = folder / "o.wav";
};

TEST_F(ZenfxErrors, UnknownNamesAndBadValuesSayWhatIsWrong) {
    ExpectEach({
        {{"process", "-o", o, "--plugin", "Soft Cliper"}, "did you mean 'Soft Clipper'"},
        {{"info", "Sft Clipper"}, "did you mean 'Soft Clipper'"},
        {Clipper({"process", "-o", o}, {"--set", "Treshold=3"}), "did you mean 'Threshold'"},
        {Clipper({"process", "-o", o}, {"--set", "Threshold=30"}), "out of range (-18 to 18 dB); a plain number is in dB, as in Threshold=0dB"},
        {Clipper({"process", "-o", o}, {"--set", "Threshold=loud"}), "not a value"},
        {Clipper({"process", "-o", o}, {"--set", "Threshold=3 Hz"}), "takes dB"},
        {Clipper({"process", "-o", o}, {"--set", "Threshold=0x10"}), "is hexadecimal; give a decimal value"},
        {Clipper({"process", "-o", folder / "out.wav"}, {"--set", "Shape=7"}), "out of range"},
    });
}

TEST_F(ZenfxErrors, FileAndUsageMistakesLeaveEveryFileAsItWas) {
    ExpectEach({
        {Clipper({"process", folder / "missing.wav", "-o", o}), "cannot read"},
        {Clipper({"process", folder / "text.wav", "-o", o}), "cannot read"},
        {Clipper({"process", "-o", folder / "o.mp3"}), "unknown file type"},
        {Clipper({"process", "-o", folder / "o.flac", "--format", "float"}), "cannot hold float"},
        {Clipper({"process", "-o", o, "--format", "pcm12"}), "unknown --format 'pcm12'"},
        {{"--library", ZEN_TEST_LIBRARY_PATH, "process", folder / "three.wav", "-o", o, "--plugin", "Test Delay"},
         "'Test Delay' does not accept 3 channels (it takes 1 or 2)"},
        {Clipper({"process", in, "-o", in}), "is the input file"},
        {Clipper({"process", in, "-o", folder / "./in.wav"}), "is the input file"},
        {Clipper({"process", folder.Path(), "-o", o}), "it is a folder, not an audio file"},
        {Clipper({"process", "-", "-o", o}), "reading standard input ('-') is not supported"},
        {Clipper({"process", in, "-o", "-"}), "writing to standard output ('-') is not supported"},
        {Clipper({"process", in, "-o", folder / "dir/"}), "is a folder: give a file name in it"},
        {Clipper({"process", in, "-o", "/dev/null"}), "'/dev/null' is not a regular file"},
        {Clipper({"process", in, "-o", folder / "o"}), "it has no extension to tell the file type"},
        {Clipper({"process", folder / "fast.wav", "-o", o}), "is at 768000 Hz; the plug-ins run at 8000 to 384000 Hz"},
        {Clipper({"process", "--set", "a=1", "-o", o}), "comes before any --plugin"},
        {{"process", "-o", o}, "at least one --plugin"},
        {Clipper({"process"}), "--output"},
        {{"frobnicate"}, "zenfx"},
    });
}
