// The levelling engine's gain law: targets per mode, limits and shares,
// the slope limit, phrase lookahead and pause hold, range points, clip
// normalisation, finality of answers ten entries ahead, and the text action
// each channel of the studio answers.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>
#include <string>
#include <vector>

#include "HostCore/Actions/ActionServices.h"
#include "HostCore/Levelling/LevellingEngine.h"
#include "HostCore/Studio/StudioModel.h"

using zen::host::LevellingEngine;
using zen::host::LevellingSettings;
using zen::levelling::EntryRecord;
using zen::levelling::kNoSpeech;
using S = zen::host::LevellingSettings;

namespace {

constexpr int kNarrator = 1;

// Feeds `inputs` ten at a time as the plug-in does, then finishes; one
// record per entry.
std::vector<EntryRecord> Level(LevellingEngine& engine, const std::vector<float>& inputs) {
    std::vector<EntryRecord> out;
    std::int64_t first = 0;
    for (; first < static_cast<std::int64_t>(inputs.size()); first += 10) {
        LevellingEngine::Inputs block;
        for (std::size_t i = 0; i < block.size(); ++i) {
            const auto e = static_cast<std::size_t>(first) + i;
            block[i] = e < inputs.size() ? inputs[e] : kNoSpeech;
        }
        const auto records = engine.Process(first, block);
        if (first >= 10) out.insert(out.end(), records.begin(), records.end());
    }
    const auto last = engine.Finish(first);
    out.insert(out.end(), last.begin(), last.end());
    out.resize(inputs.size());
    return out;
}

std::vector<float> Phrases(const std::vector<std::pair<float, int>>& runs) {
    std::vector<float> v;
    for (const auto& [level, entries] : runs) v.insert(v.end(), static_cast<std::size_t>(entries), level);
    return v;
}

double Db(const EntryRecord& r) { return r.gain / 10.0; }

LevellingEngine Narrator() {
    LevellingEngine engine;
    engine.Settings().SetMode(kNarrator);
    return engine;
}

}  // namespace

TEST(LevellingEngine, SteadySpeechReachesTheModesTargetWithinLimitsAndShares) {
    for (int mode = 0; mode < 4; ++mode)
        for (const float level : {-40.0f, -24.0f, -12.0f}) {
            LevellingEngine engine;
            engine.Settings().SetMode(mode);
            const auto records = Level(engine, std::vector<float>(30, level));
            const double target = zen::levelling::kModeTargets[static_cast<std::size_t>(mode)];
            const double expected = mode == 0 ? 0.0 : std::clamp(target - level, -18.0, 24.0);
            for (const EntryRecord& r : records) {
                ASSERT_NEAR(Db(r), expected, 0.051) << "mode " << mode << ", speech at " << level;
                EXPECT_EQ(r.input, static_cast<int>(level * 10));
                EXPECT_EQ(r.output, r.input + r.gain);
                EXPECT_EQ(r.speech, 1000);
            }
        }

    struct Case {
        const char* what;
        std::vector<std::pair<std::uint32_t, float>> settings;
        float level;
        double gain;
    };
    const Case cases[] = {
        {"offset", {{S::kTargetOffset, 3.0f}}, -24.0f, 9.0},
        {"max boost", {{S::kMaxBoost, 6.0f}}, -40.0f, 6.0},
        {"max cut", {{S::kMaxCut, 3.0f}}, -10.0f, -3.0},
        {"reduce loud", {{S::kReduceLoudDialogue, 0.5f}}, -10.0f, -4.0},
        {"lift soft", {{S::kLiftSoftDialogue, 0.25f}}, -30.0f, 3.0},
        {"manage loud off", {{S::kManageLoudDialogue, 0.0f}}, -10.0f, 0.0},
        {"output trim", {{S::kOutputTrim, -2.0f}}, -24.0f, 4.0},
        {"above the range", {{S::kMaxBoost, 99.0f}}, -60.0f, 30.0},
    };
    for (const Case& c : cases) {
        LevellingEngine engine = Narrator();
        for (const auto& [index, value] : c.settings) ASSERT_TRUE(engine.Settings().Set(index, value));
        for (const EntryRecord& r : Level(engine, std::vector<float>(30, c.level)))
            ASSERT_NEAR(Db(r), c.gain, 0.051) << c.what;
    }
    // The plug-in's own switches and indexes past the table are not the engine's.
    EXPECT_FALSE(Narrator().Settings().Set(zen::levelling::kLevellingOnIndex, 1.0f));
    EXPECT_FALSE(Narrator().Settings().Set(38, 1.0f));
}

TEST(LevellingEngine, GainStepsStayWithinTheRateAndReachEachPhraseOnItsFirstEntry) {
    std::mt19937 random(5);
    std::uniform_real_distribution<float> level(-45.0f, -10.0f);
    std::uniform_int_distribution<int> length(1, 12);
    std::vector<std::pair<float, int>> runs;
    for (int phrase = 0; phrase < 40; ++phrase)
        runs.push_back({phrase % 2 ? kNoSpeech : level(random), length(random)});
    const std::vector<float> inputs = Phrases(runs);
    for (const float rate : {0.5f, 1.5f, 2.5f}) {
        LevellingEngine engine = Narrator();
        engine.Settings().Set(S::kMaxGainRate, rate);
        const auto records = Level(engine, inputs);
        for (std::size_t e = 1; e < records.size(); ++e)
            ASSERT_LE(std::abs(Db(records[e]) - Db(records[e - 1])), rate * 0.4 + 0.1) << "entry " << e;
    }

    // Phrases 6 dB apart with a 6-entry pause: at 1 dB per entry the pause
    // is long enough, so each phrase has its own gain from its first entry
    // and the pause moves only from one to the other.
    LevellingEngine engine = Narrator();
    const auto records =
        Level(engine, Phrases({{-30.0f, 12}, {kNoSpeech, 6}, {-24.0f, 12}, {kNoSpeech, 6}, {-30.0f, 12}}));
    for (int e = 0; e < 12; ++e) EXPECT_NEAR(Db(records[static_cast<std::size_t>(e)]), 12.0, 0.051) << e;
    for (int e = 18; e < 30; ++e) EXPECT_NEAR(Db(records[static_cast<std::size_t>(e)]), 6.0, 0.051) << e;
    for (int e = 36; e < 48; ++e) EXPECT_NEAR(Db(records[static_cast<std::size_t>(e)]), 12.0, 0.051) << e;
    for (std::size_t e = 12; e < 18; ++e) {
        EXPECT_LE(Db(records[e]), Db(records[e - 1]) + 0.001) << "falls only, entry " << e;
        EXPECT_EQ(records[e].speech, 0);
        EXPECT_EQ(records[e].output, static_cast<int>(kNoSpeech * 10));
    }
    for (std::size_t e = 30; e < 36; ++e)
        EXPECT_GE(Db(records[e]), Db(records[e - 1]) - 0.001) << "rises only, entry " << e;
}

TEST(LevellingEngine, PausesHoldUnlessToldToReleaseOrReduce) {
    const std::vector<float> inputs = Phrases({{-30.0f, 10}, {kNoSpeech, 30}, {-30.0f, 10}});
    {
        LevellingEngine engine = Narrator();
        const auto records = Level(engine, inputs);
        for (const EntryRecord& r : records) ASSERT_NEAR(Db(r), 12.0, 0.051);
    }
    {
        LevellingEngine engine = Narrator();
        engine.Settings().Set(S::kPauseHold, 0.0f);
        const auto records = Level(engine, inputs);
        EXPECT_NEAR(Db(records[30]), 0.0, 0.1) << "the long pause returns to unity";
        EXPECT_GT(Db(records[49]), 11.0) << "and rises again for the phrase";
    }
    {
        LevellingEngine engine = Narrator();
        engine.Settings().Set(S::kReduceBackground, 1.0f);
        engine.Settings().Set(S::kBackgroundReduction, 6.0f);
        engine.Settings().Set(S::kHoldTime, 2.0f);
        const auto records = Level(engine, inputs);
        EXPECT_NEAR(Db(records[13]), 12.0, 0.051) << "held for the hold time";
        EXPECT_NEAR(Db(records[30]), 6.0, 0.1) << "then reduced";
        EXPECT_NEAR(Db(records[40]), 12.0, 0.051) << "and back for the phrase";
    }
}

TEST(LevellingEngine, AnswersAreFinalTenEntriesAheadAndResetReproduces) {
    std::mt19937 random(9);
    std::uniform_real_distribution<float> level(-45.0f, -10.0f);
    std::vector<float> a(200);
    for (float& v : a) v = random() % 4 == 0 ? kNoSpeech : level(random);
    LevellingEngine engine = Narrator();
    engine.Settings().SetNormaliseClips(true, zen::levelling::kNoValue, 6.0f);
    const auto first = Level(engine, a);
    for (const std::size_t changed : {std::size_t{50}, std::size_t{123}}) {
        std::vector<float> b = a;
        for (std::size_t e = changed; e < b.size(); ++e) b[e] = level(random);
        engine.Reset();
        const auto second = Level(engine, b);
        for (std::size_t e = 0; e + 10 < changed; ++e) ASSERT_EQ(second[e].gain, first[e].gain) << "entry " << e;
    }
    engine.Reset();
    const auto again = Level(engine, a);
    for (std::size_t e = 0; e < a.size(); ++e) ASSERT_EQ(again[e].gain, first[e].gain) << "entry " << e;
}

TEST(LevellingEngine, RangePointsDrawTheLawWhileSet) {
    LevellingEngine engine = Narrator();
    ASSERT_TRUE(engine.Settings().SetRangePoint(2, -20.0f, 0.0f));
    ASSERT_TRUE(engine.Settings().SetRangePoint(0, -40.0f, 10.0f));
    EXPECT_FALSE(engine.Settings().SetRangePoint(4, -40.0f, 10.0f));
    const std::pair<float, double> law[] = {
        {-50.0f, 10.0}, {-40.0f, 10.0}, {-30.0f, 5.0}, {-20.0f, 0.0}, {-10.0f, 0.0}};
    for (const auto& [in, gain] : law) {
        engine.Reset();
        EXPECT_NEAR(Db(Level(engine, std::vector<float>(20, in))[10]), gain, 0.051) << "speech at " << in;
    }
    engine.Settings().SetRangePoint(0, -70.0f, 10.0f);
    engine.Settings().SetRangePoint(2, -90.0f, 0.0f);
    engine.Reset();
    EXPECT_NEAR(Db(Level(engine, std::vector<float>(20, -30.0f))[10]), 12.0, 0.051) << "no point: target law";
}

TEST(LevellingEngine, ClipsGoToTheirTargetUnderCeilingAndMaxGainThenRideWithinRange) {
    const auto level = [](LevellingEngine& engine, const std::vector<float>& inputs) {
        engine.Reset();
        return Level(engine, inputs);
    };
    LevellingEngine engine = Narrator();
    engine.Settings().Set(S::kMaxBoost, 30.0f);
    engine.Settings().Set(S::kAttack, 0.4f);
    engine.Settings().Set(S::kRelease, 0.4f);
    engine.Settings().Set(S::kLoudnessWindow, 0.4f);  // each entry its own loudness

    // Two clips: the 8-entry pause (3.2 s) is longer than the 2 s gap.
    const std::vector<float> two = Phrases({{-30.0f, 10}, {kNoSpeech, 8}, {-20.0f, 10}});
    engine.Settings().SetNormaliseClips(true, -24.0f, 0.0f);
    auto records = level(engine, two);
    // The 10 dB between the clips take 10 entries: the last two of the first move.
    EXPECT_NEAR(Db(records[7]), 6.0, 0.051);
    EXPECT_NEAR(Db(records[27]), -4.0, 0.051);
    engine.Settings().SetNormaliseClips(true, -10.0f, 0.0f);
    engine.Settings().SetClipAdvanced(2.0f, -12.0f, 30.0f);
    records = level(engine, two);
    EXPECT_NEAR(Db(records[7]), 18.0, 0.051) << "under the ceiling, the entry standing in for the peak";
    EXPECT_NEAR(Db(records[27]), 8.0, 0.051);
    engine.Settings().SetClipAdvanced(2.0f, 0.0f, 10.0f);
    records = level(engine, two);
    EXPECT_NEAR(Db(records[7]), 10.0, 0.051) << "no more than the clip's max gain";
    engine.Settings().SetClipAdvanced(4.0f, 0.0f, 30.0f);
    records = level(engine, two);
    EXPECT_NEAR(Db(records[27]), -10.0 - 10.0 * std::log10((std::pow(10.0, -3.0) + std::pow(10.0, -2.0)) / 2), 0.15)
        << "a gap longer than the pause: one clip";

    // One clip that drops by 6 dB, at the mode's target: its gain follows the
    // clip's loudness, the ride adds at most the range.
    const std::vector<float> one = Phrases({{-30.0f, 10}, {-36.0f, 20}});
    const double clipGain = -18.0 - 10.0 * std::log10((10 * std::pow(10.0, -3.0) + 20 * std::pow(10.0, -3.6)) / 30);
    engine.Settings().SetClipAdvanced(2.0f, 0.0f, 30.0f);
    for (const float range : {0.0f, 1.0f, 20.0f}) {
        engine.Settings().SetNormaliseClips(true, zen::levelling::kNoValue, range);
        records = level(engine, one);
        EXPECT_NEAR(Db(records[29]), std::min(clipGain + range, 18.0), 0.1) << "range " << range;
    }
}

TEST(LevellingEngine, EachStudioChannelAnswersTheTextActionWithItsOwnEngine) {
    zen::host::StudioModel studio(*GetZenPluginInterface());
    studio.AddChannel("A", 2);
    studio.AddChannel("B", 2);
    std::string result;
    const auto call = [&](std::size_t channel, std::vector<const char*> args) {
        char buffer[1024] = {};
        const bool ok = zen::host::ActionServices::CallAction(
            studio.GetChannel(channel).services->Services(), zen::levelling::kEngineAction, args.data(),
            static_cast<std::uint32_t>(args.size()), buffer, sizeof(buffer));
        result = buffer;
        return ok;
    };
    const auto process = [&](std::size_t channel, const char* first) {
        return call(channel, {"Process", first, "-30", "-30", "-30", "-30", "-30", "-30", "-30", "-30", "-30", "-30"});
    };
    ASSERT_TRUE(call(0, {"Mode", "1"}) && call(0, {"1", "6"}));  // Narrator, Max Boost 6 dB
    ASSERT_TRUE(process(0, "0"));
    EXPECT_EQ(result.substr(0, 32), "0 -2000 -2000 0 0 -2000 -2000 0 ") << "before entry 0: unity";
    ASSERT_TRUE(process(0, "10"));
    EXPECT_EQ(result.substr(0, 20), "60 -300 -240 1000 60");
    ASSERT_TRUE(call(0, {"Finish", "20"}));
    EXPECT_EQ(result.substr(0, 17), "60 -300 -240 1000");
    ASSERT_TRUE(process(1, "0") && process(1, "10"));
    EXPECT_EQ(result.substr(0, 15), "0 -300 -300 100") << "channel B's own engine is unlevelled";

    EXPECT_TRUE(call(0, {"40", "1"}) && call(0, {"33", "1"})) << "indexes that are not the engine's are ignored";
    EXPECT_TRUE(call(0, {"NormaliseClips", "1", "99999", "6"}) && call(0, {"Reset"}));
    for (const std::vector<const char*>& refused : {std::vector<const char*>{"Mode", "4"}, {"Levelling"},
                                                    {"Process", "0", "1"}, {"SetRangePoint", "4", "-40", "6"}}) {
        EXPECT_FALSE(call(0, refused)) << refused[0];
        EXPECT_FALSE(result.empty()) << "a refusal says why";
    }
}
