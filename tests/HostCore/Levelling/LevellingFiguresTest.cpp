// Levelling figures, end to end through the host core: dialogue spoken at
// -38 to -14 LUFS with a music bed under some phrases, through "Dialogue
// Leveller" in two passes (analysis, then the gain list applied) as zenfx
// runs it, measured with the library's loudness meter.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <string>
#include <vector>

#include "HostCore/Studio/StudioModel.h"
#include "Support/DialogueFile.h"
#include "Support/LevellingFigures.h"
#include "zen/LevellerEngine.h"

namespace {

std::uint32_t ParameterNamed(AudioPlugin& audio, const std::string& label) {
    for (std::uint32_t i = 0; i < audio.GetParameterCount(); ++i) {
        zen::ParameterInfo info;
        if (audio.GetParameterInfo(i, info) && info.label == label) return i;
    }
    ADD_FAILURE() << "no parameter " << label;
    return 0;
}

// Runs `x` through the channel's chain in blocks of 512.
std::vector<float> RunChannel(zen::host::StudioModel& studio, std::vector<float> x, bool backgroundTasks) {
    constexpr std::size_t kBlock = 512;
    for (std::size_t n = 0; n < x.size(); n += kBlock) {
        float* channel[] = {x.data() + n};
        studio.Process(0, channel, std::min(kBlock, x.size() - n));
        if (backgroundTasks) studio.RunBackgroundTasks(0, false);
    }
    if (backgroundTasks) studio.RunBackgroundTasks(0, true);
    return x;
}

}  // namespace

TEST(LevellingFigures, TheDialogueLevellerLevelsInTwoPassesThroughTheHostCore) {
    const zentest::DialogueFile file = zentest::MakeLevelledDialogueTestFile();
    if (file.samples.empty()) GTEST_SKIP() << "espeak-ng cannot be run";
    zen::host::StudioModel studio(*GetZenPluginInterface());
    studio.AddChannel("Dialogue", 1);
    studio.InsertPlugin(0, "Dialogue Leveller");
    AudioPlugin& leveller = studio.PluginAt(0, 0);
    ASSERT_TRUE(leveller.SetParameter(ParameterNamed(leveller, "Levelling Mode"), 1.0f));  // Narrator
    const std::uint32_t apply = ParameterNamed(leveller, "Apply Gain List");
    ASSERT_GT(leveller.GetParameter(ParameterNamed(leveller, "Levelling")), 0.5f) << "the row starts levelling";
    studio.Prepare(zentest::kDialogueRate, 512);

    // The analysis runs on to the end of the last entry, which is then
    // complete and gets its answer, as zenfx does.
    leveller.SetParameter(apply, 0.0f);
    std::vector<float> padded = file.samples;
    padded.resize((padded.size() / zen::levelling::kEntryFrames + 1) * zen::levelling::kEntryFrames, 0.0f);
    EXPECT_EQ(RunChannel(studio, padded, true), padded) << "the analysis pass leaves the audio alone";
    leveller.Reset();
    leveller.SetParameter(apply, 1.0f);
    const std::vector<float> output = RunChannel(studio, file.samples, false);
    // The gain applied, read by running a constant through the same pass.
    leveller.Reset();
    std::vector<float> applied = RunChannel(studio, std::vector<float>(file.samples.size(), 0.01f), false);
    for (float& g : applied) g *= 100.0f;

    const zentest::LevellingFigures before = zentest::MeasureLevelling(file, file.samples, {});
    const zentest::LevellingFigures after = zentest::MeasureLevelling(file, output, applied);
    std::printf(
        "Dialogue Leveller, Narrator: short-term sigma %.2f LU before, %.2f after; integrated %.2f LUFS "
        "(target -18); fastest gain change %.2f dB per 100 ms; pause pump %.2f dB\n",
        before.sigma, after.sigma, after.integrated, after.fastestChange, after.pausePump);
    EXPECT_GT(before.sigma, 5.0);
    EXPECT_LE(after.sigma, 1.5);
    EXPECT_NEAR(after.integrated, -18.0, 0.5);
    EXPECT_LE(after.fastestChange, 1.0);
    EXPECT_LE(after.pausePump, 3.0);
}
