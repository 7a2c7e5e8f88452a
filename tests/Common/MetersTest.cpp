// Meter rows and their storage: readings by kind, arrays read whole while a
// writer publishes, rings drained by readers that fall behind.
#include <gtest/gtest.h>

#include <atomic>
#include <cmath>
#include <thread>
#include <vector>

#include "Common/MeterArray.h"
#include "Common/MeterDefinition.h"
#include "Common/MeterRing.h"

TEST(MeterDefinition, RowsReadByKindWithTheirStatedSilence) {
    const zen::MeterTableDefinition table = zen::MakeMeterTable(
        "ZenExample", {zen::LevelMeter("PEAK", "Peak", "dBFS", -60.0f, 6.0f),
                       zen::LevelMeter("GAIN", "Gain", "dB", -24.0f, 0.0f).SilenceReads(-24.0f).AtRest(1.0f),
                       zen::ValueMeter("CORRELATION", "Correlation", "", -1.0f, 1.0f),
                       zen::LevelMeter("FLOORED", "Floored", "dB", -30.0f, 0.0f).Floor(-30.0f)});
    ASSERT_EQ(table.size(), 4u);
    EXPECT_EQ(table[1].identifier, "ZenExample::GAIN");
    EXPECT_EQ(table[3].index, 3u);
    const zen::MeterDefinition& peak = table[0];
    EXPECT_EQ(peak.Reading(0.0f), -120.0f);      // silence reads the floor
    EXPECT_EQ(peak.Reading(1e-9f), -120.0f);     // and so does anything quieter
    EXPECT_FLOAT_EQ(peak.Reading(0.5f), 20.0f * std::log10(0.5f));
    const zen::MeterDefinition& gain = table[1];
    EXPECT_EQ(gain.Reading(0.0f), -24.0f);
    EXPECT_FLOAT_EQ(gain.Reading(0.01f), -40.0f);  // only silence is floored
    EXPECT_EQ(gain.restValue, 1.0f);
    EXPECT_EQ(table[2].Reading(-0.25f), -0.25f);  // values as published
    EXPECT_EQ(table[3].Reading(0.01f), -30.0f);
}

TEST(MeterArray, ReadersSeeWholePublicationsWhileTheWriterRuns) {
    constexpr std::uint32_t kSize = 64;
    constexpr int kPublications = 20000;
    zen::MeterArray array(kSize);
    std::atomic<bool> done{false};
    std::thread writer([&] {
        std::vector<float> values(kSize);
        for (int k = 1; k <= kPublications; ++k) {
            std::fill(values.begin(), values.end(), static_cast<float>(k));
            array.Publish(values.data());
        }
        done.store(true);
    });
    std::vector<float> read(kSize);
    int reads = 0, mixed = 0;
    float last = 0.0f;
    while (!done.load() || reads == 0) {
        if (!array.Read(read.data())) continue;
        ++reads;
        for (float v : read) mixed += v != read[0] ? 1 : 0;
        EXPECT_GE(read[0], last);  // publications arrive in order
        last = read[0];
    }
    writer.join();
    EXPECT_EQ(mixed, 0) << "values from two publications in one read, over " << reads << " reads";
    ASSERT_TRUE(array.Read(read.data()));
    EXPECT_EQ(read, std::vector<float>(kSize, static_cast<float>(kPublications)));
}

TEST(MeterRing, ReadersDrainAtTheirOwnPaceAndCountWhatTheyLost) {
    zen::MeterRing ring(2, 8);
    std::vector<float> out(16);
    auto push = [&](int from, int to) {
        for (int k = from; k < to; ++k) {
            const float record[2] = {static_cast<float>(k), -static_cast<float>(k)};
            ring.Push(record);
        }
    };
    std::uint64_t cursor = 0;
    EXPECT_EQ(ring.Read(cursor, out.data(), 8).records, 0u);
    push(0, 5);
    zen::MeterRingRead read = ring.Read(cursor, out.data(), 3);
    EXPECT_EQ(read.records, 3u);
    EXPECT_EQ(out[4], 2.0f);
    EXPECT_EQ(out[5], -2.0f);
    push(5, 20);  // records 3 to 11 are overwritten before this reader gets to them
    read = ring.Read(cursor, out.data(), 8);
    EXPECT_EQ(read.records, 8u);
    EXPECT_EQ(read.lost, 9u);
    EXPECT_EQ(out[0], 12.0f);
    EXPECT_EQ(out[14], 19.0f);
    EXPECT_EQ(cursor, 20u);
    std::uint64_t beyond = 1000;  // a cursor from before the ring was emptied
    read = ring.Read(beyond, out.data(), 8);
    EXPECT_EQ(read.records, 8u);
    EXPECT_EQ(beyond, 20u);
}

TEST(MeterRing, ARecordRewrittenWhileItWasCopiedIsDroppedNotDelivered) {
    // A writer far faster than a reader with a small buffer: every record
    // delivered must be whole and in order (record k holds k twice), and
    // delivered plus lost must account for every record.
    constexpr std::uint32_t kCapacity = 16;
    constexpr std::uint64_t kRecords = 200000;
    zen::MeterRing ring(2, kCapacity);
    std::atomic<bool> done{false};
    std::thread writer([&] {
        for (std::uint64_t k = 0; k < kRecords; ++k) {
            const float record[2] = {static_cast<float>(k), static_cast<float>(k)};
            ring.Push(record);
        }
        done.store(true);
    });
    std::uint64_t cursor = 0, delivered = 0, lost = 0, broken = 0;
    std::vector<float> out(2 * kCapacity);
    for (bool last = false; !last;) {
        last = done.load();
        const zen::MeterRingRead read = ring.Read(cursor, out.data(), kCapacity);
        delivered += read.records;
        lost += read.lost;
        const std::uint64_t first = cursor - read.records;
        for (std::uint32_t r = 0; r < read.records; ++r)
            broken += out[2 * r] != static_cast<float>(first + r) || out[2 * r + 1] != out[2 * r] ? 1 : 0;
    }
    writer.join();
    EXPECT_EQ(broken, 0u);
    EXPECT_EQ(delivered + lost, kRecords);
}
