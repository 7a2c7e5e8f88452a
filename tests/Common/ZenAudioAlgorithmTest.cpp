// The algorithm contract every processing object follows.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/ZenAudioAlgorithm.h"
#include "Support/AssertionRecorder.h"

namespace {

// A gain with one parameter in dB and a derived linear factor.
class TestGain : public ZenAudioAlgorithm {
public:
    TestGain() : ZenAudioAlgorithm(Table()) { SetParameter(0, -6.0f); }
    static const zen::ParameterTableDefinition& Table() {
        static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
            "TestGain", {zen::ContinuousParameter("GAIN", "Gain", -24.0f, 24.0f, 0.0f, 0.1f, "dB"),
                         zen::SwitchParameter("INVERT", "Invert", 0.0f)});
        return table;
    }
    bool SetParameter(std::uint64_t index, float value) override {
        if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
        factor = std::pow(10.0f, GetParameter(0) / 20.0f) * (GetParameter(1) == 1.0f ? -1.0f : 1.0f);
        return true;
    }
    void Reset() override {}
    float factor = 1.0f;
};

// An algorithm that does not process: the base refuses.
class Idle : public ZenAudioAlgorithm {
public:
    void Reset() override {}
};

}  // namespace

TEST(ZenAudioAlgorithm, OutOfRangeIndicesAreRefusedAndMetersReadZero) {
    TestGain gain;
    EXPECT_FALSE(gain.SetParameter(2, 1.0f));
    EXPECT_EQ(gain.GetParameter(2), 0.0f);
    EXPECT_EQ(gain.GetParameter(0), -6.0f);  // unchanged
    EXPECT_EQ(gain.GetParameter(1), 0.0f);
    for (std::uint64_t i : {0u, 1u, 99u}) EXPECT_EQ(gain.GetMeter(i), 0.0f);
}

TEST(ZenAudioAlgorithm, PrepareResetsEveryParameterToItsDefaultButTheSettersDoNot) {
    TestGain gain;
    EXPECT_EQ(gain.GetSampleRate(), 48000);
    EXPECT_TRUE(gain.SetSampleRate(22050));
    EXPECT_TRUE(gain.SetMaxBlockSize(17));
    EXPECT_EQ(gain.GetParameter(0), -6.0f);
    gain.SetParameter(1, 1.0f);
    ASSERT_LT(gain.factor, 0.0f);
    EXPECT_TRUE(gain.Prepare(44100.9f, 256));
    EXPECT_EQ(gain.GetSampleRate(), 44100);  // truncated
    EXPECT_EQ(gain.GetMaxBlockSize(), 256u);
    EXPECT_EQ(gain.GetParameter(0), 0.0f);
    EXPECT_EQ(gain.GetParameter(1), 0.0f);
    EXPECT_FLOAT_EQ(gain.factor, 1.0f);  // derived values recomputed through SetParameter
}

TEST(ZenAudioAlgorithm, BaseProcessingIsAProgrammingError) {
    zentest::AssertionRecorder assertions;
    Idle idle;
    float samples[4] = {1, 2, 3, 4};
    float* channels[1] = {samples};
    EXPECT_FALSE(idle.Process(channels, 4));
    EXPECT_FALSE(idle.ProcessChannel(0, samples, 4));
    ASSERT_EQ(assertions.Assertions().size(), 2u);
    EXPECT_EQ(assertions.Assertions()[0].message, "0");
    EXPECT_NE(assertions.Assertions()[0].file.find("Modules/ZenAudioPlugins/Common/ZenAudioAlgorithm"),
              std::string::npos);
    EXPECT_EQ(samples[0], 1.0f);
}

TEST(ZenAudioAlgorithm, RecordsCopyTheDefinitionsAndKnowTheirOwner) {
    TestGain gain;
    ASSERT_EQ(gain.GetParameterCount(), 2u);
    EXPECT_EQ(gain.GetParameterRecord(0).definition.identifier, "TestGain::GAIN");
    EXPECT_EQ(gain.GetParameterRecord(0).value.GetOwner(), &gain);
    EXPECT_TRUE(gain.inherits("ZenAudioAlgorithm"));  // the toolkit's cast by name
}
