// The engine's room geometry, laws and limits on the default room, and its
// update steps.
#include <gtest/gtest.h>

#include <cmath>
#include <tuple>

#include "Common/Reverb/zn_reverb.h"
#include "Common/Reverb/zn_reverb_u15.h"

using namespace zen::reverb;

namespace {

std::array<float, zn_reverb::kEntryCount> DefaultRecord() {
    zn_reverb engine(48000.0f, 1, 1);
    std::array<float, zn_reverb::kEntryCount> record{};
    for (std::uint32_t i = 0; i < zn_reverb::kEntryCount; ++i) record[i] = engine.Get(i);
    return record;
}

}  // namespace

TEST(zn_reverb, LaneLengthsOfTheDefaultRoomAreItsLongestModesOddAndDescending) {
    std::uint32_t lengths[16];
    ASSERT_TRUE(zn_reverb::RoomToLaneLengths(12.430144f, 20.112396f, 4.0f, 48000.0f, lengths));
    // The (0, 1, 0) mode: 2 x 20.112396 / 340 s = 5679 samples, less the fast
    // reciprocal square root's error (below 0.2 %).
    EXPECT_NEAR(double(lengths[0]), 5679.0, 5679.0 * 0.002);
    // The second longest is (1, 0, 0): 2 x 12.430144 / 340 s.
    EXPECT_NEAR(double(lengths[1]), 2.0 * 12.430144 / 340.0 * 48000.0, 12.0);
    for (int i = 0; i < 16; ++i) EXPECT_EQ(lengths[i] % 2, 1u) << i;
    for (int i = 1; i < 15; ++i) EXPECT_LE(lengths[i], lengths[i - 1]) << i;  // the 15 longest, descending
    for (float v : {1e-6f, 0.01f, 0.5f, 1.0f, 3.0f, 1e4f})
        EXPECT_NEAR(zn_reverb::FastInverseSqrt(v) * std::sqrt(v), 1.0f, 0.00176f) << v;
}

TEST(zn_reverb, ThinRoomsSkipTheLanesButNotTheReflections) {
    std::uint32_t lengths[16];
    std::fill(std::begin(lengths), std::end(lengths), 77u);
    EXPECT_FALSE(zn_reverb::RoomToLaneLengths(0.05f, 20.0f, 4.0f, 48000.0f, lengths));
    EXPECT_EQ(lengths[0], 77u);  // untouched
    auto record = DefaultRecord();
    record[zn_reverb::kRoomHeight] = 0.05f;
    const auto thin = zn_reverb::GeometryToReflections(record.data(), 48000.0f);
    record[zn_reverb::kRoomHeight] = 0.1f;
    const auto clamped = zn_reverb::GeometryToReflections(record.data(), 48000.0f);
    for (int t = 0; t < 16; ++t) EXPECT_EQ(thin.delays[t], clamped.delays[t]);
    // The engine never takes such a room, so its update pass cannot stall.
    zn_reverb engine(48000.0f, 1, 1);
    EXPECT_FALSE(engine.Set(zn_reverb::kRoomHeight, 0.05f));
    EXPECT_FALSE(engine.Set(zn_reverb::kRoomLength, NAN));
    EXPECT_FALSE(engine.Set(zn_reverb::kT60, 0.0f));
    EXPECT_EQ(engine.Get(zn_reverb::kRoomHeight), 4.0f);
    engine.Update();
    EXPECT_EQ(engine.Dirty(), 0);
}

TEST(zn_reverb, ReflectionsOfTheDefaultRoom) {
    const auto record = DefaultRecord();
    const auto r = zn_reverb::GeometryToReflections(record.data(), 48000.0f);
    EXPECT_NEAR(r.directDistance, 4.0f, 1e-5f);  // inside the room: not clamped
    EXPECT_NEAR(r.directGain, 0.2f, 1e-6f);
    const float minimum = 48000.0f / 340.0f * 0.1f;  // 0.1 m of path behind the direct sound
    EXPECT_GE(float(r.delays[0]), std::floor(minimum));
    for (int t = 1; t < 16; ++t) {
        EXPECT_GE(r.delays[t], r.delays[t - 1]) << t;
        EXPECT_LT(r.gains[t], r.gains[t - 1] + 1e-7f) << t;  // farther, quieter
    }
    // Independent check of the nearest image: the ceiling (0, 0, 1).
    const double a = 0.2 * M_PI, e = 0.1 * M_PI;
    const double z = std::sin(e) * 4.0, x = std::cos(a) * 4.0 * std::cos(e), y = std::sin(a) * 4.0 * std::cos(e);
    const double ceiling = std::sqrt(x * x + y * y + std::pow(4.0 - z, 2));
    EXPECT_NEAR(r.delays[0], std::nearbyint(48000.0 / 340.0 * (ceiling - 4.0)), 0.5);
    EXPECT_NEAR(r.gains[0], 1.0 / (ceiling + 1.0), 1e-6);
}

TEST(zn_reverb, SourceDistanceEdges) {
    auto record = DefaultRecord();
    record[zn_reverb::kSourceDistance] = 0.0f;
    EXPECT_NEAR(zn_reverb::GeometryToReflections(record.data(), 48000.0f).directDistance, 0.01f, 1e-6f);
    record[zn_reverb::kSourceDistance] = 1000.0f;  // beyond the walls: 95 % of the half-dimensions
    const auto far = zn_reverb::GeometryToReflections(record.data(), 48000.0f);
    const double a = 0.2 * M_PI, e = 0.1 * M_PI;
    const double x = std::min(std::cos(a) * 1000.0 * std::cos(e), 0.475 * 12.430144);
    const double y = std::min(std::sin(a) * 1000.0 * std::cos(e), 0.475 * 20.112396);
    const double z = std::min(std::sin(e) * 1000.0, 0.475 * 4.0);
    EXPECT_NEAR(far.directDistance, std::sqrt(x * x + y * y + z * z), 1e-4);
}

TEST(zn_reverb, PreDelay) {
    auto record = DefaultRecord();
    const auto none = zn_reverb::GeometryToReflections(record.data(), 48000.0f);
    record[zn_reverb::kPreDelay] = 0.02f;
    const auto twenty = zn_reverb::GeometryToReflections(record.data(), 48000.0f);
    for (int t = 0; t < 16; ++t) EXPECT_NEAR(double(twenty.delays[t]) - none.delays[t], 960.0, 1.0) << t;
    record[zn_reverb::kPreDelay] = 1e-6f;  // adds max(0.048, 4 - delay_0) samples
    const auto tiny = zn_reverb::GeometryToReflections(record.data(), 48000.0f);
    EXPECT_GE(tiny.delays[0], 4u);
    EXPECT_LE(tiny.delays[0], none.delays[0] + 1);
}

TEST(zn_reverb, DampingAndLateLevelLaws) {
    zn_reverb engine(48000.0f, 2, 2);
    engine.Update();
    const auto& core = engine.Param().tail.core;
    double sumTau = 0.0;
    for (std::uint32_t i = 0; i < 16; ++i) {
        // Gain at Nyquist g (1 + c) / (1 - c) = g^(1 / alpha), alpha 0.5.
        const double g = core.gains(i), c = core.coefficients(i);
        EXPECT_NEAR(g * (1.0 + c) / (1.0 - c), std::pow(g, 2.0), 1e-5) << i;
        sumTau += engine.LaneTime(i);
    }
    // The late level follows the energy the lanes hold: their times over T60.
    EXPECT_NEAR(engine.LateLevel(), std::sqrt(sumTau / 0.95), 1e-5);
    // alpha = 1: no damping; alpha near 0: the coefficient's limit.
    engine.Set(zn_reverb::kHighDecayRatio, 1.0f);
    engine.Update();
    EXPECT_EQ(engine.Param().tail.core.coefficients(0), 0.0f);
    EXPECT_EQ(engine.Param().tail.out.tone(0), 0.0f);
    engine.Set(zn_reverb::kHighDecayRatio, 1e-4f);
    engine.Update();
    EXPECT_FLOAT_EQ(engine.Param().tail.core.coefficients(0), -0.9999f);
}

TEST(zn_reverb, ModulationDepthsStopAtTheLinesLimit) {
    zn_reverb engine(48000.0f, 1, 1);
    engine.Set(zn_reverb::kModulation, 100.0f);
    engine.Update();
    EXPECT_FLOAT_EQ(engine.Param().reflections.depths(15), 20.0f);
    EXPECT_FLOAT_EQ(engine.Param().reflections.depths(0), 12.0f);
}

TEST(zn_reverb, MixLaw) {
    const float g = 0.2f, L = 0.9f;
    EXPECT_EQ(zn_reverb::DirectMixGain(0.0f, g), 1.0f);  // dry passes at unity
    EXPECT_EQ(zn_reverb::EarlyMixGain(0.0f), 0.0f);
    EXPECT_EQ(zn_reverb::LateMixGain(0.0f, L), 0.0f);
    EXPECT_NEAR(zn_reverb::DirectMixGain(0.5f, g), g, 1e-6f);  // the distance law
    EXPECT_NEAR(zn_reverb::DirectMixGain(0.25f, g), std::sqrt(g), 1e-6f);
    EXPECT_EQ(zn_reverb::DirectMixGain(1.0f, g), 0.0f);  // fully wet: no direct sound
    EXPECT_EQ(zn_reverb::EarlyMixGain(1.0f), 1.0f);
    EXPECT_NEAR(zn_reverb::LateMixGain(1.0f, L), 1.0f, 1e-6f);
    EXPECT_NEAR(zn_reverb::LateMixGain(0.75f, L), std::sqrt(L), 1e-6f);
    EXPECT_NEAR(zn_reverb::LateMixGain(0.5f, L), L, 1e-6f);
    EXPECT_NEAR(zn_reverb::EarlyMixGain(0.25f), 0.5f, 1e-6f);
}

TEST(zn_reverb, EachStepRunsOnlyWhenItsInputsChange) {
    zn_reverb engine(48000.0f, 2, 2);
    EXPECT_EQ(engine.Dirty(), zn_reverb::kAllSteps);
    // Runs of lane lengths, decay, reflections, direct, early and late gain, modulation, EQ.
    auto runs = [&] {
        std::vector<unsigned> counts;
        for (unsigned step = 1; step <= 128; step *= 2) counts.push_back(engine.Runs(zn_reverb::Step(step)));
        return counts;
    };
    engine.Update();
    // The decay step sets the late gain again, run after it in the same pass.
    EXPECT_EQ(runs(), (std::vector<unsigned>{1, 1, 1, 1, 1, 1, 1, 1}));
    engine.Set(zn_reverb::kPreDelay, 0.01f);
    EXPECT_EQ(engine.Dirty(), zn_reverb::kStepReflections);
    engine.Update();
    EXPECT_EQ(runs(), (std::vector<unsigned>{1, 1, 2, 2, 2, 1, 1, 1}));
    engine.Set(zn_reverb::kRoomWidth, 15.0f);
    engine.Update();
    EXPECT_EQ(runs(), (std::vector<unsigned>{2, 2, 3, 3, 3, 2, 1, 1}));
    EXPECT_EQ(engine.Dirty(), 0);
    EXPECT_FALSE(engine.Update());  // nothing to do
}

TEST(zn_reverb, HigherRatesRunTheRoomAtTheBaseRateTheyDivideInto) {
    for (const auto& [rate, engineRate, factor] :
         {std::tuple{44100.0f, 44100.0f, 1u}, {48000.0f, 48000.0f, 1u}, {88200.0f, 44100.0f, 2u},
          {96000.0f, 48000.0f, 2u}, {176400.0f, 44100.0f, 4u}, {192000.0f, 48000.0f, 4u}}) {
        EXPECT_EQ(zn_reverb_u15::EngineRateFor(rate), engineRate) << rate;
        EXPECT_EQ(zn_reverb_u15::ForRate(rate)->Factor(), factor) << rate;
    }
}
