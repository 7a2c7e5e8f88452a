// The tempo map against positions worked out by hand, and samples taken to
// bars and beats and back over random maps.
#include <gtest/gtest.h>

#include <random>

#include "HostCore/HostError.h"
#include "HostCore/Time/TempoMap.h"

using zen::host::BarBeat;
using zen::host::Meter;
using zen::host::TempoMap;

namespace {

void ExpectAt(const TempoMap& map, std::int64_t sample, std::int64_t bar, int beat) {
    const BarBeat p = map.SampleToBarBeat(static_cast<double>(sample));
    EXPECT_EQ(p.bar, bar) << "sample " << sample;
    EXPECT_EQ(p.beat, beat) << "sample " << sample;
    EXPECT_EQ(p.fraction, 0.0) << "sample " << sample;
    EXPECT_EQ(map.BarBeatToSample({bar, beat, 0.0}), static_cast<double>(sample)) << bar << "." << beat;
}

}  // namespace

TEST(TempoMap, PositionsAreExactAtTempoAndMeterChanges) {
    // 120 per minute in 4/4 at 48 kHz: a quarter is 24000 samples.
    TempoMap map(48000.0);
    map.SetTempo(3, 1, 90.0);   // bar 3 at 192000; quarters of 32000 from there
    map.SetMeter(4, {7, 8});    // bar 4 at 320000; bars of 3.5 quarters
    map.SetTempo(5, 3, 150.0);  // bar 5 at 432000, beat 3 one quarter later
    ExpectAt(map, 0, 1, 1);
    ExpectAt(map, 24000, 1, 2);
    ExpectAt(map, 96000, 2, 1);
    ExpectAt(map, 192000, 3, 1);
    ExpectAt(map, 320000, 4, 1);
    ExpectAt(map, 336000, 4, 2);  // an eighth of 16000
    ExpectAt(map, 432000, 5, 1);
    ExpectAt(map, 464000, 5, 3);
    ExpectAt(map, 464000 + 9600, 5, 4);  // eighths of 9600 at 150
    EXPECT_EQ(map.TempoAt(191999.0), 120.0);
    EXPECT_EQ(map.TempoAt(192000.0), 90.0);
    EXPECT_EQ(map.MeterAt(4).denominator, 8);

    // A sample between two beats, and seconds.
    const BarBeat half = map.SampleToBarBeat(12000.0);
    EXPECT_EQ(half.bar, 1);
    EXPECT_EQ(half.beat, 1);
    EXPECT_DOUBLE_EQ(half.fraction, 0.5);
    EXPECT_DOUBLE_EQ(map.BarBeatToSeconds({3, 1, 0.0}), 4.0);
    EXPECT_EQ(map.SecondsToBarBeat(4.0).bar, 3);
}

TEST(TempoMap, AChangeBetweenSamplesKeepsItsFractionalPosition) {
    TempoMap map(44100.0, 97.0);
    map.SetTempo(2, 2, 131.0);
    const double change = map.BarBeatToSample({2, 2, 0.0});
    EXPECT_DOUBLE_EQ(change, 5.0 * 44100.0 * 60.0 / 97.0);
    EXPECT_NE(change, std::floor(change));
    const auto after = static_cast<std::int64_t>(std::ceil(change));
    EXPECT_EQ(map.SampleToBarBeat(static_cast<double>(after)).beat, 2);
    EXPECT_EQ(map.SampleToBarBeat(static_cast<double>(after - 1)).beat, 1);
}

TEST(TempoMap, SampleToBarBeatAndBackIsTheSameSampleOverRandomMaps) {
    std::mt19937 random(7);
    const double rates[] = {44100.0, 48000.0, 96000.0, 192000.0};
    for (int round = 0; round < 20; ++round) {
        TempoMap map(rates[round % 4], std::uniform_real_distribution<double>(40.0, 240.0)(random));
        const int denominators[] = {2, 4, 8, 16};
        for (std::int64_t bar = 2; bar < 60; bar += std::uniform_int_distribution<int>(1, 6)(random)) {
            if (random() % 2 == 0) {
                map.SetMeter(bar, {std::uniform_int_distribution<int>(1, 13)(random), denominators[random() % 4]});
            } else {
                const int beats = map.MeterAt(bar).numerator;
                map.SetTempo(bar, std::uniform_int_distribution<int>(1, beats)(random),
                             std::uniform_real_distribution<double>(30.0, 300.0)(random));
            }
        }
        std::uniform_int_distribution<std::int64_t> anywhere(0, static_cast<std::int64_t>(map.SampleRate() * 600));
        for (int i = 0; i < 2000; ++i) {
            const std::int64_t sample = anywhere(random);
            const BarBeat p = map.SampleToBarBeat(static_cast<double>(sample));
            ASSERT_GE(p.fraction, 0.0);
            ASSERT_LT(p.fraction, 1.0);
            ASSERT_LE(p.beat, map.MeterAt(p.bar).numerator);
            ASSERT_EQ(map.NearestSample(p), sample) << "round " << round << " bar " << p.bar << " beat " << p.beat;
        }
    }
}

TEST(TempoMap, RefusesImpossibleTemposMetersAndBeats) {
    EXPECT_THROW(TempoMap(0.0), zen::host::HostError);
    EXPECT_THROW(TempoMap(48000.0, 0.0), zen::host::HostError);
    EXPECT_THROW(TempoMap(48000.0, 120.0, {4, 3}), zen::host::HostError);
    TempoMap map(48000.0);
    EXPECT_THROW(map.SetTempo(2, 5, 100.0), zen::host::HostError);  // 4/4 has no beat 5
    EXPECT_THROW(map.SetTempo(0, 1, 100.0), zen::host::HostError);
    map.SetTempo(3, 4, 100.0);
    EXPECT_THROW(map.SetMeter(2, {3, 4}), zen::host::HostError);  // would strand the change on beat 4
    EXPECT_EQ(map.MeterAt(3).numerator, 4);
}
