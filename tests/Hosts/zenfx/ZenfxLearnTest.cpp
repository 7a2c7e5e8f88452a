// zenfx process --learn START:END: a plug-in learns from a region of the
// file, then the whole file is processed with what it learnt.
#include <gtest/gtest.h>

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

// Hiss throughout, a 1 kHz tone over the second half second only.
std::vector<float> HissThenTone() {
    std::vector<float> x(kRate);
    std::uint32_t state = 7;
    for (std::size_t n = 0; n < x.size(); ++n) {
        state = state * 1664525u + 1013904223u;
        x[n] = 0.05f * (static_cast<float>(state >> 8) / 8388608.0f - 1.0f);
        if (n >= x.size() / 2) x[n] += 0.3f * std::sin(2.0f * 3.14159265f * 1000.0f * static_cast<float>(n) / kRate);
    }
    return x;
}

double RmsDb(const std::vector<float>& x, std::size_t from, std::size_t to) {
    double sum = 0.0;
    for (std::size_t n = from; n < to; ++n) sum += static_cast<double>(x[n]) * x[n];
    return 10.0 * std::log10(sum / static_cast<double>(to - from) + 1e-30);
}

}  // namespace

TEST(ZenfxLearn, LearnsFromTheRegionThenProcessesTheWholeFile) {
    TempFolder folder;
    const std::vector<float> x = HissThenTone();
    WriteAudio(folder / "in.wav", {x}, kRate);
    auto result = RunZenfx({"process", folder / "in.wav", "-o", folder / "out.wav", "--plugin", "Noise Reduction",
                            "--set", "Estimate=Learned", "--set", "Reduction=30", "--learn", "0.1:0.45",
                            "--meters-json", folder / "meters.json"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    EXPECT_NE(result.out.find("Noise Reduction learnt from 0.10 to 0.45 s"), std::string::npos) << result.out;
    const std::vector<float> y = ReadAudio(folder / "out.wav").samples;
    ASSERT_EQ(y.size(), x.size());
    // The hiss from its first frame on: the profile was there before the pass.
    EXPECT_LT(RmsDb(y, 2048, 20000) - RmsDb(x, 2048, 20000), -25.0);
    EXPECT_NEAR(RmsDb(y, 30000, 46000), RmsDb(x, 30000, 46000), 1.0);  // the tone passes
    std::ifstream meters(folder / "meters.json");
    const auto json = nlohmann::json::parse(meters);
    bool found = false;
    for (const auto& meter : json["plugins"][0]["meters"])
        if (meter["name"] == "Profile Learnt") found = meter["final"] == 1.0;
    EXPECT_TRUE(found);
}

// An empty region, or one outside the input, is refused in one line and
// nothing is written.
TEST(ZenfxLearn, EmptyRegionsAndPluginsWithoutLearnAreRefused) {
    TempFolder folder;
    WriteAudio(folder / "in.wav", {HissThenTone()}, kRate);
    const std::string out = folder / "out.wav";
    for (const auto& [region, expected] : {std::pair<std::string, std::string>{"0.5:0.5", "empty region"},
                                           {"0.4:0.1", "empty region"},
                                           {"-1:0.5", "empty region"},
                                           {"3:4", "holds no audio: the input lasts 1.00 s"},
                                           {"half", "is not START:END in seconds"}}) {
        auto result = RunZenfx({"process", folder / "in.wav", "-o", out, "--plugin", "Noise Reduction", "--learn", region});
        EXPECT_NE(result.exitCode, 0) << region;
        EXPECT_NE(result.err.find(expected), std::string::npos) << region << ": " << result.err;
        EXPECT_EQ(std::count(result.err.begin(), result.err.end(), '\n'), 1) << result.err;
    }
    auto limiter = RunZenfx({"process", folder / "in.wav", "-o", out, "--plugin", "Limiter", "--learn", "0:0.5"});
    EXPECT_NE(limiter.err.find("'Limiter' has no parameter 'Learn'"), std::string::npos) << limiter.err;
    auto early = RunZenfx({"process", folder / "in.wav", "-o", out, "--learn", "0:0.5", "--plugin", "Limiter"});
    EXPECT_NE(early.err.find("comes before any --plugin"), std::string::npos) << early.err;
    EXPECT_EQ(folder.Files().size(), 1u);
}
