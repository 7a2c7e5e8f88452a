// The De-Esser as a zenfx user meets it: listed, run on the demo speech with
// its meters, and a clear refusal of layouts it does not take.
#include <gtest/gtest.h>

#include <fstream>
#include <nlohmann/json.hpp>

#include "ZenfxRunner.h"

using zentest::RunZenfx;
using zentest::TempFolder;

TEST(ZenfxDeesser, ListedRunsOnStereoWithItsMetersAndRefusesSurround) {
    auto list = RunZenfx({"list"});
    ASSERT_EQ(list.exitCode, 0) << list.err;
    EXPECT_NE(list.out.find("De-Esser:1516596851"), std::string::npos);

    TempFolder folder;
    auto result = RunZenfx({"process", "-o", folder / "out.wav", "--plugin", "De-Esser", "--set", "Frequency=6kHz",
                            "--set", "Range=Wide", "--set", "Amount=80%", "--meters-json", folder / "meters.json"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    EXPECT_EQ(zentest::ReadAudio(folder / "out.wav").info.channels, 2);
    std::ifstream file(folder / "meters.json");
    const auto meters = nlohmann::json::parse(file)["plugins"][0]["meters"];
    ASSERT_EQ(meters.size(), 2u);
    EXPECT_EQ(meters[0]["name"], "Reduction");
    EXPECT_EQ(meters[0]["unit"], "dB");
    EXPECT_LE(meters[0]["value"].get<double>(), 0.5);
    EXPECT_GT(meters[0]["value"].get<double>(), -20.0);
    EXPECT_EQ(meters[1]["name"], "Output");

    // Labels win over upper-case names: "Range" is the band's shape, "ZenDeesser::RANGE" its frequency.
    auto mixed = RunZenfx({"process", "-o", folder / "out2.wav", "--plugin", "De-Esser", "--set", "range=HF", "--set",
                           "ZenDeesser::RANGE=5k"});
    EXPECT_EQ(mixed.exitCode, 0) << mixed.err;

    const std::vector<float> x(64, 0.1f);
    zentest::WriteAudio(folder / "surround.wav", {x, x, x, x, x, x}, 48000);
    auto refused = RunZenfx({"process", folder / "surround.wav", "-o", folder / "o.wav", "--plugin", "De-Esser"});
    EXPECT_NE(refused.exitCode, 0);
    EXPECT_NE(refused.err.find("'De-Esser' does not accept 6 channels (it takes 1 or 2)"), std::string::npos)
        << refused.err;
    EXPECT_FALSE(std::ifstream(folder / "o.wav").good());
}
