// zenfx process with "Dialogue Leveller": two passes, analysis then the
// gain list applied, on quiet speech spoken by espeak-ng.
#include <gtest/gtest.h>

#include <cmath>

#include "ZenfxRunner.h"

using zentest::ReadAudio;
using zentest::RunZenfx;
using zentest::TempFolder;
using zentest::WriteAudio;

namespace {

double RmsDb(const std::vector<float>& x) {
    double sum = 0.0;
    for (const float v : x) sum += static_cast<double>(v) * v;
    return 10.0 * std::log10(sum / static_cast<double>(x.size()) + 1e-30);
}

}  // namespace

TEST(ZenfxLevelling, DialogueLevellerLiftsQuietSpeechInTwoPassesAndUnlevelledLeavesItAlone) {
    TempFolder folder;
    const zentest::ZenfxResult spoken = zentest::RunProgram(
        "espeak-ng", {"-w", folder / "spoken.wav",
                      "The morning train left the station a little after six. Nobody on the platform seemed to "
                      "notice the old man. He carried a small leather case."});
    if (spoken.exitCode != 0) GTEST_SKIP() << "espeak-ng cannot be run";
    const zentest::AudioData speech = ReadAudio(folder / "spoken.wav");
    std::vector<float> quiet = speech.Channel(0);
    for (float& v : quiet) v *= 0.03f;  // -30 dB
    WriteAudio(folder / "quiet.wav", {quiet}, speech.info.samplerate);

    const zentest::ZenfxResult levelled =
        RunZenfx({"process", folder / "quiet.wav", "-o", folder / "levelled.wav", "--plugin", "Dialogue Leveller",
                  "--set", "Levelling Mode=Narrator"});
    ASSERT_EQ(levelled.exitCode, 0) << levelled.err;
    EXPECT_NE(levelled.out.find("first pass"), std::string::npos) << levelled.out;
    const std::vector<float> out = ReadAudio(folder / "levelled.wav").Channel(0);
    ASSERT_EQ(out.size(), quiet.size());
    EXPECT_GT(RmsDb(out) - RmsDb(quiet), 12.0);

    const zentest::ZenfxResult unlevelled =
        RunZenfx({"process", folder / "quiet.wav", "-o", folder / "unlevelled.wav", "--plugin", "Dialogue Leveller",
                  "--set", "Levelling Mode=Unlevelled"});
    ASSERT_EQ(unlevelled.exitCode, 0) << unlevelled.err;
    EXPECT_EQ(ReadAudio(folder / "unlevelled.wav").Channel(0), quiet);
}
