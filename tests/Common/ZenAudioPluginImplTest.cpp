// The audio plug-in base as a host drives it, through the test-only
// "Test Delay" plug-in (latency, a smoothed gain, a stepped list parameter,
// meters of every kind).
#include <gtest/gtest.h>

#include <cmath>
#include <iterator>
#include <thread>

#include "Common/Decibels.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"
#include "TestPlugins/ZenTestDelay.h"

using zentest::PluginHarness;

TEST(ZenAudioPluginImpl, RefusesLayoutsRatesAndBlocksItCannotTake) {
    PluginHarness plugin("Test Delay");
    AudioPlugin& audio = plugin.Audio();
    EXPECT_EQ(audio.GetInputChannelCount(), 2u);
    EXPECT_EQ(audio.GetOutputChannelCount(), 2u);
    std::vector<float> x = {1.0f, 2.0f};
    float* channels[2] = {x.data(), x.data()};
    EXPECT_FALSE(audio.Process(channels, 1));  // before Prepare: untouched
    EXPECT_EQ(x[0], 1.0f);
    EXPECT_TRUE(audio.ConfigureChannels(1, 1));
    EXPECT_FALSE(audio.ConfigureChannels(3, 3));  // beyond the descriptor's limit
    EXPECT_FALSE(audio.ConfigureChannels(2, 1));  // outputs must match inputs
    EXPECT_FALSE(audio.ConfigureChannels(0, 0));
    EXPECT_EQ(audio.GetInputChannelCount(), 1u);
    for (float rate : {0.0f, NAN, 1e6f}) EXPECT_FALSE(audio.Prepare(rate, 512)) << rate;
    EXPECT_FALSE(audio.Prepare(48000.0f, 0));
    EXPECT_TRUE(audio.Prepare(22050.0f, 1));
}

TEST(ZenAudioPluginImpl, ParameterIndicesValuesAndClamping) {
    PluginHarness plugin("Test Delay");
    AudioPlugin& audio = plugin.Audio();
    ASSERT_EQ(audio.GetParameterCount(), 3u);
    EXPECT_FALSE(audio.SetParameter(3, 1.0f));  // index equal to the table length
    EXPECT_EQ(audio.GetParameter(3), 0.0f);
    EXPECT_FALSE(audio.SetParameter(1, NAN));
    EXPECT_EQ(audio.GetParameter(1), 0.0f);
    EXPECT_TRUE(audio.SetParameter(1, 100.0f));
    EXPECT_EQ(audio.GetParameter(1), 12.0f);
    EXPECT_TRUE(audio.SetParameter(2, 0.7f));  // list values land on an entry
    EXPECT_EQ(audio.GetParameter(2), 1.0f);

    zen::ParameterInfo info;
    EXPECT_FALSE(audio.GetParameterInfo(3, info));
    ASSERT_TRUE(audio.GetParameterInfo(2, info));
    EXPECT_EQ(info.identifier, "ZenTestDelay::MODE");
    EXPECT_EQ(info.kind, zen::ParameterKind::List);
    EXPECT_EQ(info.choices, (std::vector<std::string>{"Plain", "Inverted"}));
}

TEST(ZenAudioPluginImpl, PositionsThroughTheControlValueHost) {
    PluginHarness plugin("Test Delay");
    auto* controls = zen::InterfaceCast<ZenControlValueHost>(&plugin.Instance());
    EXPECT_EQ(controls->FindParameter("ZenTestDelay::GAIN"), 1);
    EXPECT_EQ(controls->FindParameter("Gain"), 1);
    EXPECT_EQ(controls->FindParameter("gain"), -1);
    EXPECT_FLOAT_EQ(controls->GetParameterPosition(1), 24.0f / 36.0f);
    EXPECT_TRUE(controls->SetParameterPosition(1, 1.0f));
    EXPECT_EQ(plugin.Audio().GetParameter(1), 12.0f);
    EXPECT_FALSE(controls->SetParameterPosition(9, 0.5f));
}

TEST(ZenAudioPluginImpl, StateRestoresEveryParameterAndBypass) {
    PluginHarness source("Test Delay");
    source.Set("Delay", 17.0f);
    source.Set("Gain", -3.5f);
    source.Set("Mode", 1.0f);
    source.Audio().SetBypass(true);
    const std::string state = source.Audio().SaveState();

    PluginHarness target("Test Delay");
    ASSERT_TRUE(target.Audio().LoadState(state));
    for (std::uint32_t i = 0; i < 3; ++i) EXPECT_EQ(target.Audio().GetParameter(i), source.Audio().GetParameter(i));
    EXPECT_TRUE(target.Audio().IsBypassed());
}

TEST(ZenAudioPluginImpl, MalformedOrForeignStateChangesNothing) {
    PluginHarness plugin("Test Delay");
    plugin.Set("Gain", -3.0f);
    for (const char* bad : {"", "not json", "[]", "{\"parameters\": 3}",
                            "{\"class\": \"ZenSoftClipper\", \"parameters\": {}}",
                            "{\"parameters\": {\"ZenTestDelay::GAIN\": \"loud\"}}"}) {
        EXPECT_FALSE(plugin.Audio().LoadState(bad)) << bad;
        EXPECT_EQ(plugin.Get("Gain"), -3.0f) << bad;
    }
    // Unknown identifiers are ignored, missing ones keep their values.
    EXPECT_TRUE(plugin.Audio().LoadState("{\"parameters\": {\"ZenTestDelay::DELAY\": 5, \"Other::X\": 1}}"));
    EXPECT_EQ(plugin.Get("Delay"), 5.0f);
    EXPECT_EQ(plugin.Get("Gain"), -3.0f);
}

TEST(ZenAudioPluginImpl, ReportsLatencyAndKeepsItWhenBypassed) {
    PluginHarness plugin("Test Delay");
    plugin.Set("Delay", 100.0f);
    plugin.Prepare(1);
    EXPECT_EQ(plugin.Audio().GetLatency(), 100u);
    plugin.Audio().SetBypass(true);
    plugin.Audio().Reset();
    auto out = plugin.Run(zentest::Impulse(1000, 10), 1, 64);
    EXPECT_EQ(zentest::ArgPeak(out[0]), 110u);
    EXPECT_EQ(out[0][110], 1.0f);  // bypassed: the input itself, delayed
    EXPECT_EQ(plugin.Audio().GetLatency(), 100u);
}

TEST(ZenAudioPluginImpl, BypassSwitchesWithoutAClick) {
    PluginHarness plugin("Test Delay");
    plugin.Set("Delay", 0.0f);
    plugin.Set("Mode", 1.0f);  // inverted: the worst case for a hard switch
    plugin.Prepare(1, 48000.0f, 256);
    constexpr int kBlocks = 188;
    const std::vector<float> sine = zentest::Sine(100.0, 48000.0, kBlocks * 256, 0.5);
    zentest::Channels buffer(1, sine);
    std::vector<float*> pointers(1);
    std::size_t done = 0;
    for (int block = 0; block < kBlocks; ++block, done += 256) {
        if (block == 40) plugin.Audio().SetBypass(true);
        if (block == 120) plugin.Audio().SetBypass(false);
        pointers[0] = buffer[0].data() + done;
        plugin.Audio().Process(pointers.data(), 256);
    }
    // A hard switch between x and -x would jump by up to 1.0.
    const float sineStep = zentest::LargestStep(sine);
    EXPECT_LT(zentest::LargestStep(buffer[0]), 3.0f * sineStep + 0.01f);
    EXPECT_EQ(buffer[0][100 * 256], sine[100 * 256]);    // bypassed
    EXPECT_EQ(buffer[0][180 * 256], -sine[180 * 256]);   // processing again
}

// What a plug-in can never see, processing or bypassed: NaN and infinities
// arrive as silence, huge finite values held at the input limit.
TEST(ZenAudioPluginImpl, InputIsGuardedBeforeAnyPluginSeesIt) {
    const float limit = ZenAudioPluginImpl::kInputLimit;
    const std::vector<float> input = {NAN, INFINITY, -INFINITY, 1e19f, -3e38f, 0.25f, -limit, limit * 1.5f};
    const std::vector<float> guarded = {0.0f, 0.0f, 0.0f, limit, -limit, 0.25f, -limit, limit};
    for (bool bypassed : {false, true}) {
        PluginHarness plugin("Test Delay");
        plugin.Set("Delay", 0.0f);
        plugin.Audio().SetBypass(bypassed);
        plugin.Prepare(2);
        const auto out = plugin.Run(input, 2, 3);
        EXPECT_EQ(out[0], guarded) << (bypassed ? "bypassed" : "processing");
        EXPECT_EQ(out[1], guarded) << (bypassed ? "bypassed" : "processing");
    }
}

TEST(ZenAudioPluginImpl, LongBlocksAreSplitAtThePreparedMaximum) {
    PluginHarness plugin("Test Delay");
    plugin.Set("Delay", 3.0f);
    plugin.Prepare(2, 48000.0f, 16);
    const std::vector<float> input = zentest::Noise(1000);
    auto out = plugin.Run(input, 2, 1000);  // one call, 1000 frames
    for (std::size_t n = 3; n < input.size(); ++n) ASSERT_EQ(out[1][n], input[n - 3]) << n;
}

TEST(ZenAudioPluginImpl, SteppedValuesReachTheAudioThreadBeforeTheNextBlock) {
    PluginHarness plugin("Test Delay");
    plugin.Prepare(1, 48000.0f, 64);
    auto& impl = dynamic_cast<ZenTestDelay&>(plugin.Instance());
    auto runOnAnAudioThread = [&] {
        std::thread::id audio;
        std::thread([&] {
            audio = std::this_thread::get_id();
            plugin.Run(zentest::Noise(64), 1);
        }).join();
        return audio;
    };
    EXPECT_EQ(impl.UpdatesSeen(), 0);  // nothing before the first block
    std::thread::id audio = runOnAnAudioThread();
    EXPECT_EQ(impl.UpdateThread(), audio);
    // Every stepped parameter once after Prepare; the smoothed gain never comes this way.
    EXPECT_EQ(impl.UpdatesSeen(), 2);
    EXPECT_EQ(impl.ParametersUpdated(), (1u << ZenTestDelay::kDelay) | (1u << ZenTestDelay::kMode));
    plugin.Set("Mode", 1.0f);
    plugin.Set("Mode", 0.0f);
    plugin.Set("Gain", -3.0f);
    EXPECT_EQ(impl.UpdatesSeen(), 2);
    audio = runOnAnAudioThread();
    EXPECT_EQ(impl.UpdateThread(), audio);
    EXPECT_EQ(impl.UpdatesSeen(), 3);  // coalesced: one update per changed parameter
    plugin.Run(zentest::Noise(64), 1);
    EXPECT_EQ(impl.UpdatesSeen(), 3);
    plugin.Prepare(1, 48000.0f, 64);
    plugin.Run(zentest::Noise(64), 1);
    EXPECT_EQ(impl.UpdatesSeen(), 5);  // and again after every Prepare
}

TEST(ZenAudioPluginImpl, SmoothedValuesJumpBeforeProcessingAndRampWithTheSharedLawWhileProcessing) {
    for (float rate : {48000.0f, 96000.0f}) {
        PluginHarness plugin("Test Delay");
        plugin.Set("Delay", 0.0f);
        plugin.Set("Gain", -6.0f);  // before processing: at once
        plugin.Prepare(1, rate, 256);
        auto out = plugin.Run(std::vector<float>(256, 1.0f), 1);
        const float start = std::pow(10.0f, -6.0f / 20.0f);
        EXPECT_FLOAT_EQ(out[0][0], start) << rate;
        EXPECT_FLOAT_EQ(out[0][255], start) << rate;

        // While running: one step per sample of g = a g + (1 - a) target, a =
        // exp(-2 pi / (200 ms fs)), from the first sample of the next block.
        plugin.Set("Gain", 0.0f);
        out = plugin.Run(std::vector<float>(256, 1.0f), 1);
        const double a = std::exp(-2.0 * 3.141592653589793 / (0.2 * rate));
        for (std::size_t n = 0; n < 256; ++n) {
            const double expected = 1.0 + (start - 1.0) * std::pow(a, static_cast<double>(n + 1));
            ASSERT_NEAR(out[0][n], expected, 1e-6) << rate << " Hz, sample " << n;
        }
        // Prepared again: not running, so a change jumps once more.
        plugin.Prepare(1, rate, 256);
        plugin.Set("Gain", -12.0f);
        EXPECT_FLOAT_EQ(plugin.Run(std::vector<float>(1, 1.0f), 1)[0][0], std::pow(10.0f, -12.0f / 20.0f));
    }
}

TEST(ZenAudioPluginImpl, ParametersChangeSafelyFromAnotherThread) {
    PluginHarness plugin("Test Delay");
    plugin.Prepare(2, 48000.0f, 128);
    std::atomic<bool> stop{false};
    std::thread ui([&] {
        for (int i = 0; !stop.load(); ++i) {
            plugin.Audio().SetParameter(1, static_cast<float>(i % 24) - 12.0f);
            plugin.Audio().SetParameter(2, static_cast<float>(i % 2));
            plugin.Audio().SetBypass(i % 7 == 0);
        }
    });
    const std::vector<float> noise = zentest::Noise(128);
    bool finite = true;
    for (int block = 0; block < 2000 && finite; ++block) {
        zentest::Channels buffers(2, noise);
        plugin.Process(buffers, 128);
        for (float v : buffers[0]) finite &= std::isfinite(v) && std::fabs(v) <= 4.0f;
    }
    stop = true;
    ui.join();
    EXPECT_TRUE(finite);
}

TEST(ZenAudioPluginImpl, MetersExpandTheDeclaredTableForTheChannelLayout) {
    PluginHarness plugin("Test Delay");
    AudioPlugin& audio = plugin.Audio();
    plugin.Prepare(2);
    const struct {
        const char* identifier;
        const char* name;
        zen::MeterKind kind;
        std::uint32_t size, capacity;
    } expected[] = {
        {"ZenTestDelay::OUTPUT_PEAK_1", "Output Peak 1", zen::MeterKind::Level, 1, 0},
        {"ZenTestDelay::OUTPUT_PEAK_2", "Output Peak 2", zen::MeterKind::Level, 1, 0},
        {"ZenTestDelay::LAST_SAMPLES", "Last Samples", zen::MeterKind::Array, ZenTestDelay::kLastSampleCount, 0},
        {"ZenTestDelay::POINTS", "Points", zen::MeterKind::Ring, 2, ZenTestDelay::kPointCapacity},
    };
    ASSERT_EQ(audio.GetMeterCount(), std::size(expected));
    for (std::uint32_t i = 0; i < std::size(expected); ++i) {
        zen::MeterInfo info;
        ASSERT_TRUE(audio.GetMeterInfo(i, info));
        EXPECT_EQ(info.identifier, expected[i].identifier);
        EXPECT_EQ(info.name, expected[i].name);
        EXPECT_EQ(info.kind, expected[i].kind) << info.name;
        EXPECT_EQ(info.size, expected[i].size) << info.name;
        EXPECT_EQ(info.capacity, expected[i].capacity) << info.name;
    }
    zen::MeterInfo past;
    EXPECT_FALSE(audio.GetMeterInfo(4, past));
    ASSERT_TRUE(audio.ConfigureChannels(1, 1));
    EXPECT_EQ(audio.GetMeterCount(), 3u);  // one output peak
    ASSERT_TRUE(audio.GetMeterInfo(1, past));
    EXPECT_EQ(past.name, "Last Samples");
}

TEST(ZenAudioPluginImpl, MetersReadWhatTheAudioThreadPublishedAndRestAfterReset) {
    PluginHarness plugin = zentest::Prepared("Test Delay", {{"Delay", 0.0f}, {"Gain", -6.0f}}, 2);
    AudioPlugin& audio = plugin.Audio();
    std::vector<float> array(ZenTestDelay::kLastSampleCount, -1.0f);
    // At rest: silence, zeros.
    EXPECT_EQ(audio.GetMeter(0), zen::kMeterFloorDb);
    ASSERT_TRUE(audio.ReadMeterArray(2, array.data(), ZenTestDelay::kLastSampleCount));
    EXPECT_EQ(array, std::vector<float>(ZenTestDelay::kLastSampleCount, 0.0f));

    zentest::Channels io = {zentest::Noise(100, 0.5, 1), zentest::Noise(100, 0.1, 2)};
    plugin.Process(io);
    EXPECT_FLOAT_EQ(audio.GetMeter(0), 20.0f * std::log10(zentest::Peak(io[0])));
    EXPECT_FLOAT_EQ(audio.GetMeter(1), 20.0f * std::log10(zentest::Peak(io[1])));
    ASSERT_TRUE(audio.ReadMeterArray(2, array.data(), ZenTestDelay::kLastSampleCount));
    EXPECT_EQ(array, std::vector<float>(io[0].end() - ZenTestDelay::kLastSampleCount, io[0].end()));
    // The wrong call for a meter's kind reads nothing.
    EXPECT_EQ(audio.GetMeter(2), 0.0f);
    EXPECT_FALSE(audio.ReadMeterArray(2, array.data(), ZenTestDelay::kLastSampleCount - 1));
    EXPECT_FALSE(audio.ReadMeterArray(0, array.data(), ZenTestDelay::kLastSampleCount));
    std::uint64_t cursor = 0;
    EXPECT_EQ(audio.ReadMeterRing(2, cursor, array.data(), 1).records, 0u);

    audio.Reset();
    EXPECT_EQ(audio.GetMeter(1), zen::kMeterFloorDb);
    ASSERT_TRUE(audio.ReadMeterArray(2, array.data(), ZenTestDelay::kLastSampleCount));
    EXPECT_EQ(array, std::vector<float>(ZenTestDelay::kLastSampleCount, 0.0f));
}

TEST(ZenAudioPluginImpl, RingMetersDrainFromTheReadersCursorAndCountWhatWasLost) {
    PluginHarness plugin = zentest::Prepared("Test Delay", {{"Delay", 0.0f}}, 2);
    AudioPlugin& audio = plugin.Audio();
    constexpr std::uint32_t kRing = 3;
    constexpr std::uint32_t kCapacity = ZenTestDelay::kPointCapacity;
    const zentest::Channels input = {zentest::Noise(1000, 0.5, 3), zentest::Noise(1000, 0.5, 4)};
    auto run = [&](std::size_t from, std::size_t frames) {
        zentest::Channels io = {std::vector<float>(input[0].begin() + from, input[0].begin() + from + frames),
                                std::vector<float>(input[1].begin() + from, input[1].begin() + from + frames)};
        plugin.Process(io, 64);
    };
    // Point n is the output frame n: (first channel, last channel).
    auto expectPoints = [&](const std::vector<float>& records, std::size_t first, std::size_t count) {
        for (std::size_t r = 0; r < count; ++r) {
            ASSERT_EQ(records[2 * r], input[0][first + r]) << "point " << first + r;
            ASSERT_EQ(records[2 * r + 1], input[1][first + r]) << "point " << first + r;
        }
    };
    std::vector<float> records(2 * kCapacity);
    std::uint64_t fast = 0, slow = 0;

    run(0, 100);
    zen::MeterRingRead read = audio.ReadMeterRing(kRing, fast, records.data(), 40);
    EXPECT_EQ(read.records, 40u);
    EXPECT_EQ(read.lost, 0u);
    expectPoints(records, 0, 40);
    read = audio.ReadMeterRing(kRing, fast, records.data(), kCapacity);
    EXPECT_EQ(read.records, 60u);
    expectPoints(records, 40, 60);
    EXPECT_EQ(audio.ReadMeterRing(kRing, fast, records.data(), kCapacity).records, 0u);

    // 900 more points: the slow reader, still at 0, lost all but the last 256.
    run(100, 900);
    read = audio.ReadMeterRing(kRing, slow, records.data(), kCapacity);
    EXPECT_EQ(read.records, kCapacity);
    EXPECT_EQ(read.lost, 1000u - kCapacity);
    expectPoints(records, 1000 - kCapacity, kCapacity);
    read = audio.ReadMeterRing(kRing, fast, records.data(), kCapacity);
    EXPECT_EQ(read.lost, 900u - kCapacity);
    EXPECT_EQ(slow, 1000u);
    EXPECT_EQ(fast, 1000u);

    // Prepare empties the ring; a cursor beyond it starts again from 0.
    plugin.Prepare(2);
    run(0, 10);
    read = audio.ReadMeterRing(kRing, slow, records.data(), kCapacity);
    EXPECT_EQ(read.records, 10u);
    EXPECT_EQ(read.lost, 0u);
    expectPoints(records, 0, 10);
}

TEST(ZenAudioPluginImpl, PresetsComeFromTheResourceTrees) {
    PluginHarness clipper("Soft Clipper");
    const auto names = clipper.Audio().GetPresetNames();
    ASSERT_FALSE(names.empty());
    EXPECT_NE(std::find(names.begin(), names.end(), "Warm Drive"), names.end());
    EXPECT_TRUE(clipper.Audio().LoadPreset("Warm Drive"));
    EXPECT_EQ(clipper.Get("Threshold"), 6.0f);
    EXPECT_FALSE(clipper.Audio().LoadPreset("No Such Preset"));
}
