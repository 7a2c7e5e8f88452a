#include "AnalyserChecks.h"

#include <gtest/gtest.h>

#include "Signals.h"

namespace zentest {

namespace {

std::vector<std::vector<float>> RingRecords(AudioPlugin& audio, std::uint32_t index, const zen::MeterInfo& info) {
    std::vector<float> records(std::size_t{info.size} * info.capacity);
    std::uint64_t cursor = 0;
    const zen::MeterRingRead read = audio.ReadMeterRing(index, cursor, records.data(), info.capacity);
    std::vector<std::vector<float>> out;
    for (std::uint32_t r = 0; r < read.records; ++r)
        out.emplace_back(records.begin() + std::ptrdiff_t{r} * info.size,
                         records.begin() + std::ptrdiff_t{r + 1} * info.size);
    return out;
}

}  // namespace

std::vector<std::vector<float>> ReadAllMeters(AudioPlugin& audio) {
    std::vector<std::vector<float>> readings;
    for (std::uint32_t m = 0; m < audio.GetMeterCount(); ++m) {
        zen::MeterInfo info;
        audio.GetMeterInfo(m, info);
        if (info.kind == zen::MeterKind::Array) {
            std::vector<float> values(info.size);
            EXPECT_TRUE(audio.ReadMeterArray(m, values.data(), info.size)) << info.name;
            readings.push_back(values);
        } else if (info.kind == zen::MeterKind::Ring) {
            for (auto& record : RingRecords(audio, m, info)) readings.push_back(std::move(record));
            readings.push_back({});  // the end of this ring
        } else {
            readings.push_back({audio.GetMeter(m)});
        }
    }
    return readings;
}

std::vector<float> LastRingRecord(AudioPlugin& audio, const std::string& name) {
    for (std::uint32_t m = 0; m < audio.GetMeterCount(); ++m) {
        zen::MeterInfo info;
        audio.GetMeterInfo(m, info);
        if (info.name != name) continue;
        auto records = RingRecords(audio, m, info);
        return records.empty() ? std::vector<float>{} : records.back();
    }
    ADD_FAILURE() << "no ring " << name;
    return {};
}

void ExpectTransparentAndSplitInvariant(const std::string& name, std::uint32_t channels,
                                        const std::vector<std::pair<std::string, float>>& settings,
                                        std::size_t frames) {
    Channels input;
    for (std::uint32_t c = 0; c < channels; ++c) input.push_back(Noise(frames, 0.5, 7 + c));
    std::vector<std::vector<float>> reference;
    for (std::size_t block : {4096, 1, 7, 333}) {
        PluginHarness plugin = Prepared(name, settings, channels, 48000.0f, 4096);
        EXPECT_EQ(plugin.Audio().GetLatency(), 0u);
        Channels io = input;
        plugin.Process(io, block);
        for (std::uint32_t c = 0; c < channels; ++c)
            ASSERT_EQ(io[c], input[c]) << name << ": channel " << c << " changed in blocks of " << block;
        const auto readings = ReadAllMeters(plugin.Audio());
        if (reference.empty()) reference = readings;
        else EXPECT_EQ(readings, reference) << name << ": meters differ in blocks of " << block;
    }
}

}  // namespace zentest
