// "Frequency Analyzer" through the host interface: where a tone lands in the
// spectrum records and the bands, sizes, "Summed", and that it measures
// without touching the audio.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>

#include "Support/AnalyserChecks.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::PluginHarness;

namespace {

constexpr double kRate = 48000.0;
const double kMinusSix = std::pow(10.0, -6.0 / 20.0);

double Db(float power) { return 10.0 * std::log10(power); }

std::vector<float> Bands(AudioPlugin& audio, const std::string& name) {
    for (std::uint32_t m = 0; m < audio.GetMeterCount(); ++m) {
        zen::MeterInfo info;
        audio.GetMeterInfo(m, info);
        if (info.name != name) continue;
        std::vector<float> values(info.size);
        EXPECT_TRUE(audio.ReadMeterArray(m, values.data(), info.size));
        return values;
    }
    ADD_FAILURE() << "no array " << name;
    return {};
}

}  // namespace

TEST(ZenFrequency, ATonePeaksAtItsBinAndBandAtItsLevel) {
    // The windows' scaling is the algorithm's; here, where the readings go.
    for (float window : {0.0f, 2.0f}) {
        PluginHarness plugin = zentest::Prepared("Frequency Analyzer", {{"Window", window}, {"Average", 0.0f}}, 1);
        const double frequency = 85 * kRate / 4096;  // on bin 85, in the 1 kHz band
        plugin.Run(zentest::Sine(frequency, kRate, 16384, kMinusSix), 1, 512);
        const std::vector<float> record = zentest::LastRingRecord(plugin.Audio(), "Spectrum 1");
        ASSERT_EQ(record.at(0), 2049.0f);
        const float* average = record.data() + 1;
        const float* peak = average + 2049;
        EXPECT_EQ(std::max_element(average, average + 2049) - average, 85) << window;
        EXPECT_NEAR(Db(average[85]), -6.0, 0.05) << window;
        EXPECT_GE(peak[85], average[85]);
        EXPECT_LT(Db(average[400]), -60.0) << window;  // far from the tone
        EXPECT_EQ(record.back(), 0.0f);                // past the bins of this size
        const std::vector<float> bands = Bands(plugin.Audio(), "Third-Octave Bands 1");
        EXPECT_NEAR(bands.at(17), -6.0, 0.3) << window;  // 1 kHz
        EXPECT_LT(bands.at(10), -50.0f) << window;       // 200 Hz
    }
}

TEST(ZenFrequency, SizeSetsTheBinsAndSummedShowsTheMeanOfTheChannels) {
    PluginHarness small = zentest::Prepared("Frequency Analyzer", {{"Size", 0.0f}}, 1);
    small.Run(zentest::Sine(1000.0, kRate, 4096, 0.5), 1, 512);
    EXPECT_EQ(zentest::LastRingRecord(small.Audio(), "Spectrum 1").at(0), 513.0f);

    PluginHarness summed =
        zentest::Prepared("Frequency Analyzer", {{"Channels", 1.0f}, {"Window", 3.0f}, {"Average", 0.0f}}, 2);
    zentest::Channels x = {zentest::Sine(1000.0, kRate, 16384, kMinusSix), std::vector<float>(16384, 0.0f)};
    summed.Process(x, 512);
    const std::vector<float> record = zentest::LastRingRecord(summed.Audio(), "Spectrum 1");
    const float* average = record.data() + 1;
    // The mean of the channels' powers: half of the tone's, 3 dB down, with nothing cancelled.
    EXPECT_NEAR(Db(*std::max_element(average, average + 2049)), -9.01, 0.05);
    EXPECT_TRUE(zentest::LastRingRecord(summed.Audio(), "Spectrum 2").empty());
}

TEST(ZenFrequency, PassesAudioUntouchedAndFramesFallAlikeForAnyBlockSplit) {
    for (std::uint32_t channels : {1u, 2u, 8u})
        zentest::ExpectTransparentAndSplitInvariant("Frequency Analyzer", channels, {{"Size", 0.0f}}, 6000);
    zentest::ExpectTransparentAndSplitInvariant("Frequency Analyzer", 2, {{"Channels", 1.0f}}, 9000);
}
