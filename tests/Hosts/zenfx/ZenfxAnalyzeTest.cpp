// zenfx analyze end to end: the report of files whose loudness is known,
// --target, bad samples, silence and the files it refuses.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <nlohmann/json.hpp>

#include "ZenfxRunner.h"

using zentest::RunZenfx;
using zentest::TempFolder;
using zentest::WriteAudio;

namespace {

constexpr int kRate = 48000;

std::vector<float> Tone(double seconds, double db) {
    std::vector<float> x(static_cast<std::size_t>(seconds * kRate));
    const double amplitude = std::pow(10.0, db / 20.0);
    for (std::size_t n = 0; n < x.size(); ++n)
        x[n] = static_cast<float>(amplitude * std::sin(2.0 * M_PI * 1000.0 * n / kRate));
    return x;
}

nlohmann::json Analyse(const std::vector<std::string>& arguments) {
    std::vector<std::string> command = {"analyze", "--json"};
    command.insert(command.end(), arguments.begin(), arguments.end());
    const auto run = RunZenfx(command);
    EXPECT_EQ(run.exitCode, 0) << run.err;
    return nlohmann::json::parse(run.out).at("files");
}

}  // namespace

TEST(ZenfxAnalyze, ReportsLoudnessPeaksAndCorrelationOfAStereoFile) {
    TempFolder folder;
    const std::vector<float> tone = Tone(4.0, -23.0);
    WriteAudio(folder / "tone.wav", {tone, tone}, kRate, SF_FORMAT_WAV | SF_FORMAT_PCM_24);
    const nlohmann::json report = Analyse({folder / "tone.wav", "--target", "-16"}).at(0);
    EXPECT_NEAR(report.at("integrated").get<double>(), -23.0, 0.05);
    EXPECT_NEAR(report.at("maxShortTerm").get<double>(), -23.0, 0.05);
    EXPECT_NEAR(report.at("loudnessRange").get<double>(), 0.0, 0.1);
    EXPECT_NEAR(report.at("truePeak").get<double>(), -23.0, 0.1);
    EXPECT_NEAR(report.at("channels").at(1).at("rms").get<double>(), -26.01, 0.02);
    EXPECT_NEAR(report.at("correlation").get<double>(), 1.0, 1e-3);
    EXPECT_NEAR(report.at("gain").get<double>(), 7.0, 0.05);
    EXPECT_EQ(report.at("frames"), 4 * kRate);
    EXPECT_EQ(report.at("invalidSamples"), 0);

    const auto text = RunZenfx({"analyze", folder / "tone.wav", "--target", "-16"});
    ASSERT_EQ(text.exitCode, 0) << text.err;
    for (const char* part : {"Integrated          -23.0 LUFS", "Gain to -16.0 LUFS  +7.0 dB", "Correlation         1.00"})
        EXPECT_NE(text.out.find(part), std::string::npos) << part << "\n" << text.out;
}

TEST(ZenfxAnalyze, CountsBadSamplesAndSaysWhenNothingLiesAboveTheGate) {
    TempFolder folder;
    std::vector<float> tone = Tone(3.0, -20.0);
    tone[100] = std::numeric_limits<float>::quiet_NaN();
    tone[2000] = std::numeric_limits<float>::infinity();
    WriteAudio(folder / "bad.wav", {tone}, kRate);
    WriteAudio(folder / "quiet.wav", {std::vector<float>(kRate, 0.0f), std::vector<float>(kRate, 1e-5f)}, kRate);
    const nlohmann::json files = Analyse({folder / "bad.wav", folder / "quiet.wav"});
    EXPECT_EQ(files.at(0).at("invalidSamples"), 2);
    EXPECT_NEAR(files.at(0).at("integrated").get<double>(), -23.0, 0.1);  // one channel at -20 dBFS
    EXPECT_FALSE(files.at(0).contains("correlation"));                   // mono
    EXPECT_TRUE(files.at(1).at("integrated").is_null());
    EXPECT_TRUE(files.at(1).at("belowGate").get<bool>());
    EXPECT_TRUE(files.at(1).at("channels").at(0).at("truePeak").is_null());  // silence

    const auto text = RunZenfx({"analyze", folder / "bad.wav", folder / "quiet.wav"});
    EXPECT_NE(text.out.find("2 NaN or infinite samples were measured as silence"), std::string::npos) << text.out;
    EXPECT_NE(text.out.find("-inf LUFS (nothing above the -70 LUFS gate)"), std::string::npos) << text.out;
}

TEST(ZenfxAnalyze, RefusesEmptyUnreadableAndTooWideFilesInOneLineEachAndGoesOn) {
    TempFolder folder;
    WriteAudio(folder / "empty.wav", {{}, {}}, kRate);
    WriteAudio(folder / "wide.wav", std::vector<std::vector<float>>(33, std::vector<float>(100, 0.1f)), kRate);
    WriteAudio(folder / "good.wav", {Tone(1.0, -23.0)}, kRate);
    const auto run = RunZenfx(
        {"analyze", folder / "empty.wav", folder / "missing.wav", folder / "wide.wav", folder / "good.wav"});
    EXPECT_EQ(run.exitCode, 1);
    EXPECT_EQ(std::count(run.err.begin(), run.err.end(), '\n'), 3) << run.err;
    for (const char* part : {"empty.wav': no audio frames", "missing.wav", "33 channels; analyze takes 1 to 32"})
        EXPECT_NE(run.err.find(part), std::string::npos) << part << "\n" << run.err;
    EXPECT_NE(run.out.find("good.wav"), std::string::npos) << run.out;
}
