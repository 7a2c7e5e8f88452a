// "Reverb" through the host interface: parameters and their way into the
// engine, the room against a model of its laws, the mix law at every rate,
// layouts, click-free changes while playing, and re-preparation.
#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>

#include "Plugins/ZenReverb/ZenReverb.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zen::reverb::zn_reverb;
using zentest::PluginHarness;

namespace {

const ZenReverb& Impl(PluginHarness& plugin) { return dynamic_cast<const ZenReverb&>(plugin.Instance()); }

// Largest second difference: a click is broadband, a low sine has almost none.
float LargestCurvature(const std::vector<float>& x, std::size_t from, std::size_t to) {
    float largest = 0.0f;
    for (std::size_t i = from + 2; i < to; ++i) largest = std::max(largest, std::fabs(x[i] - 2.0f * x[i - 1] + x[i - 2]));
    return largest;
}

// The room as the reverb's laws describe it, computed independently in
// double precision: the lanes from the room's 15 longest mode periods, the
// taps from the listed image sources seen from the centre.
struct RoomModel {
    RoomModel(double length, double width, double height, double rate) {
        constexpr double kC = 340.0;
        const double L[3] = {length, width, height};
        std::vector<double> periods;
        for (int i = 0; i <= 2; ++i)
            for (int j = 0; j <= 2; ++j)
                for (int k = 0; k <= 2; ++k)
                    if (i + j + k > 0)
                        periods.push_back(2.0 / (kC * std::hypot(i / L[0], j / L[1], k / L[2])));
        std::sort(periods.rbegin(), periods.rend());
        for (std::size_t i = 0; i < lanes.size(); ++i) lanes[i] = 2.0 * std::floor(periods[i] * 0.5 * rate) + 1.0;

        // Source 4 m away at azimuth 0.2 pi, elevation 0.1 pi, kept 5 % inside the walls.
        const double a = 0.2 * zentest::kPi, e = 0.1 * zentest::kPi;
        double s[3] = {4.0 * std::cos(a) * std::cos(e), 4.0 * std::sin(a) * std::cos(e), 4.0 * std::sin(e)};
        for (int axis = 0; axis < 3; ++axis) s[axis] = std::clamp(s[axis], -0.475 * L[axis], 0.475 * L[axis]);
        const double direct = std::hypot(s[0], s[1], s[2]);
        const int images[16][3] = {{1, 0, 0},  {0, 1, 0},  {0, -1, 0}, {0, 0, 1},  {0, 0, -1}, {1, -1, 0},
                                   {-1, -1, 0}, {-1, 1, 0}, {0, 1, 1},  {0, 1, -1}, {0, -1, 1}, {0, -1, -1},
                                   {1, 0, 1},  {1, 0, -1}, {-1, 0, 1}, {-1, 0, -1}};
        for (std::size_t t = 0; t < 16; ++t) {
            double p[3];
            for (int axis = 0; axis < 3; ++axis) {
                const int n = images[t][axis];  // mirrored once per wall crossed
                p[axis] = n * L[axis] + (n % 2 == 0 ? s[axis] : -s[axis]);
            }
            reflections[t] = rate / kC * std::max(std::hypot(p[0], p[1], p[2]) - direct, 0.1);
        }
        std::sort(reflections.begin(), reflections.end());
    }

    std::array<double, 15> lanes;        // samples
    std::array<double, 16> reflections;  // samples after the direct sound
};

}  // namespace

TEST(ZenReverb, RoomDimensionsStayAboveTheEnginesMinimumAndFrequenciesAreLogarithmic) {
    PluginHarness plugin("Reverb");
    ASSERT_EQ(plugin.Audio().GetParameterCount(), 22u);
    for (std::uint32_t i = 0; i < 22; ++i) {
        zen::ParameterInfo info;
        ASSERT_TRUE(plugin.Audio().GetParameterInfo(i, info));
        // Below its minimum dimension the engine would stall.
        EXPECT_TRUE(i > ZenReverb::kRoomWidth || info.minimum > zn_reverb::kMinDimension) << i;
        EXPECT_TRUE(info.unit != "Hz" || info.taper == zen::ParameterTaper::Logarithmic) << i;
    }
    EXPECT_FALSE(plugin.Audio().SetParameter(22, 1.0f));
}

TEST(ZenReverb, ParametersReachTheEngineInItsUnits) {
    PluginHarness plugin = zentest::Prepared("Reverb", {}, 2);
    plugin.Set("Pre-Delay", 20.0f);
    plugin.Set("Brightness", 25.0f);
    plugin.Set("Dry/Wet", 100.0f);
    plugin.Set("Late Rev. Gain", -6.0f);
    plugin.Set("Early Refl. High Freq", 5000.0f);
    plugin.Set("T@-60dB", 2.5f);
    plugin.Run(std::vector<float>(64, 0.0f), 2);  // applied before the block
    const zn_reverb& engine = *Impl(plugin).Engine();
    EXPECT_FLOAT_EQ(engine.Get(zn_reverb::kPreDelay), 0.02f);
    EXPECT_FLOAT_EQ(engine.Get(zn_reverb::kHighDecayRatio), 0.25f);
    EXPECT_FLOAT_EQ(engine.Get(zn_reverb::kBalance), 1.0f);
    EXPECT_NEAR(engine.Get(zn_reverb::kLateGain), 0.501187f, 1e-6f);
    EXPECT_FLOAT_EQ(engine.Get(zn_reverb::kEq1HighFrequency), 5000.0f);  // early: EQ 1
    EXPECT_FLOAT_EQ(engine.Get(zn_reverb::kEq2HighFrequency), 10000.0f);
    EXPECT_FLOAT_EQ(engine.Get(zn_reverb::kT60), 2.5f);
    EXPECT_EQ(engine.Dirty(), 0);
}

TEST(ZenReverb, TheRoomIsLengthWidthAndHeightAsAModelOfItBuildsIt) {
    struct Room {
        float length, width, height;
    } rooms[] = {{12.430144f, 20.112396f, 4.0f}, {5.0f, 3.0f, 2.5f}, {40.0f, 10.0f, 8.0f}, {100.0f, 100.0f, 30.0f},
                 {1.0f, 1.0f, 1.0f}};
    for (const Room& room : rooms) {
        // Size and ratio far from this room's floor: stored, never read.
        PluginHarness plugin = zentest::Prepared("Reverb",
                                                 {{"Room Length", room.length}, {"Room Width", room.width},
                                                  {"Room Height", room.height}, {"Room Size", 9000.0f},
                                                  {"Room Ratio", 0.02f}, {"Dry/Wet", 100.0f}},
                                                 1);
        const auto response = plugin.Run(zentest::Impulse(4096), 1, 512)[0];
        const zn_reverb& engine = *Impl(plugin).Engine();
        EXPECT_EQ(engine.Get(zn_reverb::kRoomLength), room.length);
        EXPECT_EQ(engine.Get(zn_reverb::kRoomWidth), room.width);
        const RoomModel model(room.length, room.width, room.height, 48000.0);
        const auto& lengths = engine.Param().tail.core.lengths;
        for (std::size_t i = 0; i < model.lanes.size(); ++i) {
            // The fast reciprocal square root is within 0.18 %.
            EXPECT_NEAR(double(lengths(i)), model.lanes[i], 0.002 * model.lanes[i] + 2.0)
                << room.length << " x " << room.width << " x " << room.height << " m, lane " << i;
        }
        for (std::size_t t = 0; t < model.reflections.size(); ++t)
            EXPECT_NEAR(double(engine.Param().reflections.delays(t)), model.reflections[t], 1.0)
                << room.length << " x " << room.width << " x " << room.height << " m, tap " << t;
        // Heard: nothing before the first reflection, which arrives on time.
        const auto first = static_cast<std::size_t>(std::lround(model.reflections[0]));
        EXPECT_EQ(zentest::Peak(response, 0, first - 1), 0.0f) << room.length;
        EXPECT_GT(zentest::Peak(response, first - 1, first + 2), 0.01f) << room.length;
    }
}

TEST(ZenReverb, RoomSizeAndRatioChangeNothingYouHear) {
    const auto input = zentest::Noise(6000, 0.5, 4);
    auto render = [&](const std::vector<std::pair<std::string, float>>& settings) {
        PluginHarness plugin = zentest::Prepared("Reverb", settings, 1);
        return plugin.Run(input, 1, 512)[0];
    };
    const auto reference = render({{"Room Length", 9.0f}});
    EXPECT_EQ(render({{"Room Length", 9.0f}, {"Room Size", 40.0f}, {"Room Ratio", 7.0f}}), reference);
    EXPECT_NE(render({{"Room Length", 9.5f}}), reference);
    // A parameter never writes another.
    PluginHarness plugin("Reverb");
    plugin.Set("Room Size", 1000.0f);
    EXPECT_NEAR(plugin.Get("Room Length"), 12.430144f, 1e-5f);
}

TEST(ZenReverb, DryWetZeroPassesTheDrySignalUnchangedAtEveryRate) {
    for (float rate : {44100.0f, 48000.0f, 96000.0f, 192000.0f}) {
        PluginHarness plugin = zentest::Prepared("Reverb", {{"Dry/Wet", 0.0f}}, 2, rate, 512);
        zentest::Channels io = {zentest::Noise(5000, 0.8, 1), zentest::Noise(5000, 0.8, 2)};
        const auto input = io;
        plugin.Process(io, 333);
        EXPECT_EQ(io, input) << rate;
        EXPECT_EQ(plugin.Audio().GetLatency(), 0u);
    }
}

TEST(ZenReverb, FullyWetHasNoDirectSoundAndLaterReflectionsAndTail) {
    for (float rate : {48000.0f, 96000.0f}) {
        PluginHarness plugin = zentest::Prepared("Reverb", {{"Dry/Wet", 100.0f}}, 1, rate, 512);
        const auto out = plugin.Run(zentest::Impulse(static_cast<std::size_t>(rate)), 1, 256)[0];
        // The first reflection is 0.1 m or more behind the direct sound.
        const auto quiet = static_cast<std::size_t>(0.1 / 340.0 * rate);
        EXPECT_LT(zentest::Peak(out, 0, quiet), 1e-4f) << rate;
        EXPECT_GT(zentest::Peak(out), 0.02f) << rate;
        EXPECT_GT(zentest::Rms(out, static_cast<std::size_t>(0.3 * rate), static_cast<std::size_t>(0.4 * rate)), 1e-4)
            << rate;  // the tail is still there
    }
}

TEST(ZenReverb, PreDelayAloneLeavesTheLaneLengthsAlone) {
    PluginHarness plugin = zentest::Prepared("Reverb", {}, 2);
    plugin.Run(std::vector<float>(64, 0.0f), 2);
    const zn_reverb& engine = *Impl(plugin).Engine();
    const auto lengths = engine.Runs(zn_reverb::kStepLaneLengths);
    const auto reflections = engine.Runs(zn_reverb::kStepReflections);
    plugin.Set("Pre-Delay", 35.0f);
    plugin.Run(std::vector<float>(64, 0.0f), 2);
    EXPECT_EQ(engine.Runs(zn_reverb::kStepLaneLengths), lengths);
    EXPECT_EQ(engine.Runs(zn_reverb::kStepReflections), reflections + 1);
    EXPECT_EQ(engine.Param().reflections.delays(0) - Impl(plugin).Processor()->Reflections().Delay(0), 0u);
}

TEST(ZenReverb, LayoutsFromMonoToEightChannels) {
    for (std::uint32_t channels : {1u, 2u, 5u, 8u}) {
        PluginHarness plugin = zentest::Prepared("Reverb", {{"Dry/Wet", 100.0f}}, channels);
        const auto out = plugin.Run(zentest::Impulse(24000), channels, 512);
        for (std::uint32_t c = 0; c < channels; ++c) EXPECT_GT(zentest::Rms(out[c], 4800, 14400), 1e-4) << channels;
        if (channels > 1) {
            EXPECT_NE(out[0], out[1]);  // every channel hears its own room
        }
    }
    PluginHarness plugin("Reverb");
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(9, 9));
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(2, 1));
}

TEST(ZenReverb, ChangesWhilePlayingDoNotClick) {
    struct Change {
        const char* parameter;
        float value;
    } changes[] = {
        {"Room Width", 30.0f},   {"Room Height", 6.0f},         {"Pre-Delay", 60.0f},
        {"Distance", 1.0f},      {"T@-60dB", 6.0f},             {"Brightness", 100.0f},
        {"Modulation", 10.0f},   {"Early Refl. Low Gain", 12.0f}, {"Late Rev. Low Gain", -18.0f},
        {"Late Rev. Low Freq", 80.0f}, {"Dry/Wet", 30.0f},      {"Direct Gain", -20.0f},
        {"Early Refl. Gain", 6.0f}, {"Late Rev. Gain", -12.0f}, {"T@-60dB", 0.3f},
    };
    PluginHarness plugin = zentest::Prepared("Reverb", {{"Dry/Wet", 100.0f}}, 1);
    const std::size_t part = 12000;
    plugin.Run(zentest::Sine(150.0, 48000.0, 48000, 0.5), 1, 512);
    double phase = 48000.0;
    for (const Change& change : changes) {
        auto before = plugin.Run(zentest::Sine(150.0, 48000.0, part, 0.5, 2.0 * zentest::kPi * 150.0 * phase / 48000.0), 1, 512)[0];
        phase += part;
        plugin.Set(change.parameter, change.value);
        auto after = plugin.Run(zentest::Sine(150.0, 48000.0, part, 0.5, 2.0 * zentest::kPi * 150.0 * phase / 48000.0), 1, 512)[0];
        phase += part;
        const float usual = LargestCurvature(before, 0, part);
        const float worst = LargestCurvature(after, 0, part);
        EXPECT_LT(worst, 3.0f * usual + 2e-3f) << change.parameter << " -> " << change.value << ": curvature "
                                                << worst << " after, " << usual << " before";
    }
}

TEST(ZenReverb, NonFiniteInputDoesNotPoisonTheRoom) {
    PluginHarness plugin = zentest::Prepared("Reverb", {{"T@-60dB", 20.0f}}, 2);
    zentest::Channels io = {zentest::Noise(2048, 0.5, 1), zentest::Noise(2048, 0.5, 2)};
    io[0][100] = NAN;
    io[1][200] = INFINITY;
    io[0][300] = -1e30f;
    plugin.Process(io, 512);
    const auto later = plugin.Run(zentest::Noise(48000, 0.5, 3), 2, 512);
    for (const auto& channel : later) {
        for (float v : channel) ASSERT_TRUE(std::isfinite(v));
        EXPECT_LT(zentest::Rms(channel, 36000), zentest::Rms(channel, 0, 12000));  // dying away, not growing
    }
}

TEST(ZenReverb, ANewRateRebuildsTheEngineForItsOwnRate) {
    PluginHarness plugin = zentest::Prepared("Reverb", {{"Room Length", 9.0f}}, 2, 48000.0f);
    plugin.Run(std::vector<float>(64, 0.0f), 2);
    const auto lengthAt48 = Impl(plugin).Engine()->Param().tail.core.lengths(0);
    plugin.Prepare(2, 96000.0f);
    plugin.Run(std::vector<float>(64, 0.0f), 2);
    EXPECT_EQ(Impl(plugin).Processor()->Factor(), 2u);
    EXPECT_EQ(Impl(plugin).Engine()->SampleRate(), 48000.0f);
    EXPECT_EQ(Impl(plugin).Engine()->Param().tail.core.lengths(0), lengthAt48);  // the settings carried over
    plugin.Prepare(2, 44100.0f);
    plugin.Run(std::vector<float>(64, 0.0f), 2);
    EXPECT_EQ(Impl(plugin).Processor()->Factor(), 1u);
    EXPECT_EQ(Impl(plugin).Engine()->SampleRate(), 44100.0f);
}

TEST(ZenReverb, SameOutputInAnyBlockSplitAtHighRates) {
    const auto input = zentest::Noise(7000, 0.5, 3);
    auto run = [&](std::size_t block) {
        PluginHarness plugin = zentest::Prepared("Reverb", {}, 1, 192000.0f, 512);
        return plugin.Run(input, 1, block)[0];
    };
    const auto whole = run(512);
    for (std::size_t block : {1u, 3u, 130u}) EXPECT_EQ(run(block), whole) << block;
}

TEST(ZenReverb, AtHighRatesTheWetPathKeepsTheTopOfTheAudioBand) {
    // The engine runs at a quarter or half of a high host rate; its
    // converters must pass what the engine makes up to 20 kHz.
    auto wet = [](float rate) {
        PluginHarness plugin = zentest::Prepared("Reverb", {{"Dry/Wet", 100.0f}}, 1, rate, 512);
        return plugin.Run(zentest::Impulse(static_cast<std::size_t>(0.3 * rate)), 1, 256)[0];
    };
    // Power in a 2 kHz band: the tail's response is too ragged to compare at single frequencies.
    auto bandDb = [](const std::vector<float>& h, double rate, double centre) {
        double sum = 0.0;
        for (int k = -20; k <= 20; ++k) sum += std::pow(10.0, zentest::MagnitudeDb(h, centre + 50.0 * k, rate) / 10.0);
        return 10.0 * std::log10(sum / 41.0);
    };
    for (auto [base, high] : {std::pair{48000.0f, 96000.0f}, {48000.0f, 192000.0f}, {44100.0f, 176400.0f}}) {
        const auto reference = wet(base), converted = wet(high);
        for (double f : {1000.0, 16000.0, 20000.0})
            EXPECT_NEAR(bandDb(converted, high, f), bandDb(reference, base, f), 1.0) << high << " Hz, at " << f;
    }
}
