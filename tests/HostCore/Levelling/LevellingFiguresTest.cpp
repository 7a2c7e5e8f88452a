// Levelling figures on dialogue spoken at -38 to -14 LUFS with a music bed
// under some phrases: the engine fed with entries measured as the "AI"
// plug-in measures them, its gains applied with the plug-in's smoothing.
#include <gtest/gtest.h>

#include <cstdio>

#include "DialogueFile.h"
#include "HostCore/Levelling/LevellingEngine.h"
#include "LevellingFigures.h"
#include "SpeechEntryModel.h"

namespace {

using zen::levelling::kNoSpeech;

std::vector<int> GainList(zen::host::LevellingEngine& engine, const std::vector<float>& entries) {
    std::vector<int> tenths;
    std::int64_t first = 0;
    for (; first < static_cast<std::int64_t>(entries.size()); first += 10) {
        zen::host::LevellingEngine::Inputs block;
        for (std::size_t i = 0; i < block.size(); ++i) {
            const std::size_t e = static_cast<std::size_t>(first) + i;
            block[i] = e < entries.size() ? entries[e] : kNoSpeech;
        }
        for (const auto& r : engine.Process(first, block))
            if (first >= 10) tenths.push_back(r.gain);
    }
    for (const auto& r : engine.Finish(first)) tenths.push_back(r.gain);
    return tenths;
}

}  // namespace

TEST(LevellingFigures, DialogueComesToTheTargetEvenlyWithoutFastMovesOrPumpedPauses) {
    const zentest::DialogueFile file = zentest::MakeLevelledDialogueTestFile();
    if (file.samples.empty()) GTEST_SKIP() << "espeak-ng cannot be run";
    const std::vector<float> entries = zentest::MeasureSpeechEntries(file.samples);
    const zentest::LevellingFigures before = zentest::MeasureLevelling(file, file.samples, {});
    EXPECT_GT(before.sigma, 5.0) << "the phrases must differ for the figures to mean something";

    for (const int mode : {1, 3}) {
        zen::host::LevellingEngine engine;
        engine.Settings().SetMode(mode);
        std::vector<float> applied;
        const std::vector<int> gains = GainList(engine, entries);
        const std::vector<float> output = zentest::ApplyGainList(file.samples, gains, &applied);
        const zentest::LevellingFigures after = zentest::MeasureLevelling(file, output, applied);
        const double target = zen::levelling::kModeTargets[static_cast<std::size_t>(mode)];
        std::printf("%s: short-term sigma %.2f LU before, %.2f after; integrated %.2f LUFS (target %.0f); "
                    "fastest gain change %.2f dB per 100 ms; pause pump %.2f dB\n",
                    zen::levelling::kLevellingModes[static_cast<std::size_t>(mode)], before.sigma, after.sigma,
                    after.integrated, target, after.fastestChange, after.pausePump);
        EXPECT_LE(after.sigma, 1.5);
        EXPECT_NEAR(after.integrated, target, 0.5);
        EXPECT_LE(after.fastestChange, 1.0);
        EXPECT_LE(after.pausePump, 3.0);
    }
}
