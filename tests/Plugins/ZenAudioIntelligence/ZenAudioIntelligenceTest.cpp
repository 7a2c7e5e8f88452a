// "AI": its registry rows, the gain law and smoothing of the applied gain
// list, and the feeding of the levelling engine, through a fake host.
#include <gtest/gtest.h>

#include <cmath>
#include <string>
#include <vector>

#include "FakeHost.h"
#include "Plugins/ZenAudioIntelligence/ZenAudioIntelligence.h"
#include "zen/BackgroundTask.h"
#include "zen/LevellerEngine.h"

namespace {

using zen::levelling::kEntryFrames;
using zentest::FakeHost;

constexpr const char* kAiKey = "AI:1516596833";

struct Instance {
    std::unique_ptr<zen::PluginInstance> plugin;
    AudioPlugin* audio = nullptr;
    zen::BackgroundTask* task = nullptr;

    Instance(FakeHost& host, const std::string& key) : plugin(host.Create(key)) {
        audio = zen::InterfaceCast<AudioPlugin>(plugin.get());
        task = static_cast<zen::BackgroundTask*>(plugin->QueryInterface(zen::BackgroundTask::kInterfaceName));
    }
    void Set(std::uint32_t index, float value) { ASSERT_TRUE(audio->SetParameter(index, value)); }
    void SetEngine(std::uint32_t engineIndex, float value) { Set(ZenAudioIntelligence::kEngineFirst + engineIndex, value); }
    // Stereo, `frames` of `level`, in blocks of `block`, the background task after each.
    std::vector<float> Run(std::size_t frames, float level, std::size_t block = 512) {
        std::vector<float> left(frames, level), right(frames, level), out;
        for (std::size_t done = 0; done < frames; done += block) {
            const std::size_t n = std::min(block, frames - done);
            float* channels[2] = {left.data() + done, right.data() + done};
            EXPECT_TRUE(audio->Process(channels, n));
            task->RunBackgroundTask(false);
        }
        return left;
    }
    float Meter(const std::string& name) {
        zen::MeterInfo info;
        for (std::uint32_t i = 0; audio->GetMeterInfo(i, info); ++i)
            if (info.name == name) return audio->GetMeter(i);
        ADD_FAILURE() << "no meter " << name;
        return 0.0f;
    }
};

// An engine that answers every entry it is asked about with gain(entry).
std::function<std::string(const std::vector<std::string>&)> EngineAnswering(std::function<int(long)> gain) {
    return [gain](const std::vector<std::string>& a) {
        if (a.empty() || (a[0] != "Process" && a[0] != "Finish")) return std::string();
        const long first = std::stol(a.at(1)) - static_cast<long>(zen::levelling::kBlockEntries);
        std::string answer;
        for (long e = first; e < first + static_cast<long>(zen::levelling::kBlockEntries); ++e)
            if (e >= 0) answer += std::to_string(gain(e)) + " -230 -240 500 ";
        return answer;
    };
}

// One entry analysed (levelling on, applying off), the input ended, then the
// position reset and the list applied: the second pass's output.
std::vector<float> TwoPasses(int gainTenths, float level, std::size_t frames) {
    FakeHost host;
    host.engine = EngineAnswering([gainTenths](long) { return gainTenths; });
    Instance ai(host, kAiKey);
    ai.audio->ConfigureChannels(2, 2);
    ai.audio->Prepare(48000.0f, 512);
    ai.SetEngine(zen::levelling::kLevellingOnIndex, 1.0f);
    ai.Run(kEntryFrames, level);
    ai.task->RunBackgroundTask(true);
    ai.audio->Reset();
    ai.SetEngine(zen::levelling::kApplyGainIndex, 1.0f);
    return ai.Run(frames, level);
}

}  // namespace

TEST(ZenAudioIntelligence, FourRowsShareTheClassAndCopyTheAIRecord) {
    const auto list = GetZenPluginInterface()->GetPluginList(zen::kAudioPluginKind);
    struct Row {
        const char* key;
        std::uint32_t listFlags;
        int templateNumber;
    };
    for (const Row& row : {Row{kAiKey, 1, -1}, Row{"Dialogue Leveller:1516596844", 1, 7},
                           Row{"Mix Assistant:1516596845", 1, 8}, Row{"Dialogue Leveler:1516596850", 12, 9}}) {
        ASSERT_EQ(list.count(row.key), 1u) << row.key;
        EXPECT_EQ(list.at(row.key).listFlags, row.listFlags) << row.key;
        EXPECT_EQ(list.at(row.key).channelCount, 2u) << row.key;
        FakeHost host;
        Instance ai(host, row.key);
        ASSERT_NE(ai.task, nullptr) << row.key;
        const zen::PluginDescriptor* d = ai.plugin->GetDescriptor();
        EXPECT_STREQ(d->className, "ZenAudioIntelligence");
        EXPECT_EQ(d->state, zen::kPluginStateOffered);
        EXPECT_EQ(d->version, 1.0);
        EXPECT_EQ(d->inputChannelLimit, 2u);
        EXPECT_EQ(d->templateNumber, row.templateNumber);
        // A template row shows its template and starts levelling.
        const float levelling = ai.audio->GetParameter(ZenAudioIntelligence::kEngineFirst + 33);
        if (row.templateNumber >= 0) {
            EXPECT_EQ(ai.audio->GetParameter(ZenAudioIntelligence::kTemplate), static_cast<float>(row.templateNumber));
            EXPECT_EQ(levelling, 1.0f) << row.key;
        } else {
            EXPECT_EQ(levelling, 0.0f);
        }
    }
}

TEST(ZenAudioIntelligence, GainLawMuteUnityAndTwentyDecibels) {
    EXPECT_EQ(ZenAudioIntelligence::TargetGain(-1000), 0.0f);
    EXPECT_FLOAT_EQ(ZenAudioIntelligence::TargetGain(-999), std::pow(10.0f, -999.0f / 200.0f));
    EXPECT_EQ(ZenAudioIntelligence::TargetGain(0), 1.0f);
    EXPECT_NEAR(ZenAudioIntelligence::TargetGain(200), 10.0f, 1e-5f);

    // Through the audio path: the whole entry smoothed from unity.
    const float level = 0.05f;
    const std::vector<float> muted = TwoPasses(-1000, level, kEntryFrames);
    EXPECT_LT(std::fabs(muted.back()), level * 1e-5f);
    const std::vector<float> unity = TwoPasses(0, level, kEntryFrames);
    for (float y : unity) ASSERT_EQ(y, level);  // exactly: the gain never leaves 1.0
    const std::vector<float> boosted = TwoPasses(200, level, kEntryFrames);
    EXPECT_NEAR(boosted.back() / level, 10.0f, 1e-3f);
}

TEST(ZenAudioIntelligence, StepReachesOneMinusOneOverEAfterAbout1600Samples) {
    const float level = 0.01f;
    const std::vector<float> y = TwoPasses(200, level, 4096);
    const float mark = 1.0f + 9.0f * (1.0f - std::exp(-1.0f));
    std::size_t reached = 0;
    while (reached < y.size() && y[reached] / level < mark) ++reached;
    // 100 updates, one after every 16th sample: sample 1585 is the first to carry the 100th.
    EXPECT_NEAR(static_cast<double>(reached), 1600.0, 20.0);
    // Only the sample after each 16th moves.
    for (std::size_t i = 2; i < 64; ++i)
        if ((i - 1) % 16 != 0) {
            EXPECT_EQ(y[i], y[i - 1]) << i;
        }
}

TEST(ZenAudioIntelligence, FeedsTheEngineFortyEntriesBehindAndAppliesItsAnswers) {
    FakeHost host;
    host.engine = EngineAnswering([](long entry) { return static_cast<int>(entry) * 10; });
    Instance ai(host, kAiKey);
    ai.audio->ConfigureChannels(2, 2);
    ai.audio->Prepare(48000.0f, 4800);
    ai.SetEngine(zen::levelling::kLevellingOnIndex, 1.0f);
    const std::size_t entries = 52;
    ai.Run(entries * kEntryFrames + kEntryFrames / 2, 0.0f, 4800);
    ai.task->RunBackgroundTask(true);

    std::vector<std::string> firsts;
    for (const auto& a : host.CallsOf("AudioLevellerEngine"))
        if (a[0] == "Process" || a[0] == "Finish") firsts.push_back(a[0] + " " + a[1]);
    const std::vector<std::string> expected = {
        "Process 0",  "Process 0",  "Process 10", "Process 0",  "Process 10", "Process 20", "Process 0",
        "Process 10", "Process 20", "Process 30", "Process 10", "Process 20", "Process 30", "Process 40",
        "Process 50", "Finish 60"};
    EXPECT_EQ(firsts, expected);
    const auto engineCalls = host.CallsOf("AudioLevellerEngine");
    ASSERT_FALSE(engineCalls.empty());
    EXPECT_EQ(engineCalls.front(), (std::vector<std::string>{"Mode", "2"}));
    // The last block: two measured entries of silence, the half entry and padding.
    for (const auto& a : engineCalls)
        if (a[0] == "Process" && a[1] == "50") {
            ASSERT_EQ(a.size(), 12u);
            for (std::size_t v = 2; v < 12; ++v) EXPECT_EQ(std::stof(a[v]), zen::levelling::kNoSpeech);
        }

    // Second pass: by the end of entry e the gain has settled on the answer for e.
    ai.audio->Reset();
    ai.SetEngine(zen::levelling::kApplyGainIndex, 1.0f);
    for (std::size_t e = 0; e < entries; ++e) {
        ai.Run(kEntryFrames, 0.0f, 4800);
        EXPECT_NEAR(ai.Meter("Gain"), static_cast<float>(e), 0.15f) << "entry " << e;
    }
}
