// Parameter definitions, tapers and normalised positions.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/ParameterDefinition.h"
#include "Common/PluginParameter.h"

namespace {

const zen::ParameterTableDefinition& Table() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "TaperTest", {
                         zen::ContinuousParameter("GAIN", "Gain", -18.0f, 6.0f, 0.0f, 0.1f, "dB"),
                         zen::LogarithmicParameter("FREQ", "Freq", 20.0f, 22000.0f, 1000.0f, 1.0f, "Hz"),
                         zen::LogarithmicParameter("FROM_ZERO", "From Zero", 0.0f, 100.0f, 10.0f, 1.0f),
                         zen::ListParameter("SHAPE", "Shape", {"LPF", "HPF", "LShelf", "HShelf", "Bell"}, 4.0f),
                         zen::ListParameter("ONE", "One", {"Only"}, 0.0f),
                         zen::SwitchParameter("IN", "In", 0.0f),
                     });
    return table;
}

struct Record {
    explicit Record(std::size_t index) { parameter.Init(Table()[index]); }
    zen::PluginParameter parameter;
};

}  // namespace

TEST(ParameterDefinition, TableNumbersRowsAndPrefixesIdentifiersWithTheClass) {
    const auto& table = Table();
    ASSERT_EQ(table.size(), 6u);
    for (std::size_t i = 0; i < table.size(); ++i) EXPECT_EQ(table[i].index, i);
    EXPECT_EQ(table[0].identifier, "TaperTest::GAIN");
    EXPECT_EQ(table[3].maximum, 4.0f);  // a list's last index
    EXPECT_EQ(table[1].Taper(), zen::ParameterTaper::Logarithmic);
    EXPECT_EQ(table[3].Taper(), zen::ParameterTaper::List);
    EXPECT_EQ(table[5].Taper(), zen::ParameterTaper::Linear);
}

TEST(ParameterDefinition, ConstrainKeepsValuesInRangeAndOnSteps) {
    const auto& table = Table();
    EXPECT_EQ(table[0].Constrain(30.0f), 6.0f);
    EXPECT_EQ(table[0].Constrain(-30.0f), -18.0f);
    EXPECT_EQ(table[0].Constrain(1.234f), 1.234f);  // continuous values are not quantised
    EXPECT_EQ(table[3].Constrain(2.6f), 3.0f);
    EXPECT_EQ(table[3].Constrain(9.0f), 4.0f);
    EXPECT_EQ(table[5].Constrain(0.4f), 0.0f);
}

TEST(PluginParameter, LinearPositionFollowsEveryChange) {
    Record gain(0);
    EXPECT_FLOAT_EQ(gain.parameter.ValueToPosition(-18.0f), 0.0f);
    EXPECT_FLOAT_EQ(gain.parameter.ValueToPosition(6.0f), 1.0f);
    EXPECT_FLOAT_EQ(gain.parameter.GetPosition(), 0.75f);  // the default's, 0 dB
    EXPECT_FLOAT_EQ(gain.parameter.Exchange(6.0f), 0.0f);   // gives the previous value back
    EXPECT_FLOAT_EQ(gain.parameter.GetPosition(), 1.0f);
}

TEST(PluginParameter, LogarithmicPositionEvenFromAMinimumOfZero) {
    Record freq(1);
    EXPECT_NEAR(freq.parameter.ValueToPosition(20.0f), 0.0f, 1e-6);
    EXPECT_NEAR(freq.parameter.ValueToPosition(22000.0f), 1.0f, 1e-6);
    // Geometric mean sits in the middle.
    EXPECT_NEAR(freq.parameter.ValueToPosition(std::sqrt(20.0f * 22000.0f)), 0.5f, 1e-5);
    EXPECT_NEAR(freq.parameter.PositionToValue(0.5f), std::sqrt(20.0f * 22000.0f), 0.01f);
    Record fromZero(2);
    const float position = fromZero.parameter.ValueToPosition(0.0f);
    EXPECT_FALSE(std::isnan(position));
    EXPECT_LT(position, -1.0f);  // far below 0, not a division by zero; callers clamp
    EXPECT_NEAR(fromZero.parameter.ValueToPosition(100.0f), 1.0f, 1e-6);
}

TEST(PluginParameter, ListPositionIsIndexOverLastIndexEvenForOneEntry) {
    Record shape(3);
    EXPECT_EQ(shape.parameter.GetDiscreteValues().size(), 5u);
    EXPECT_FLOAT_EQ(shape.parameter.ValueToPosition(0.0f), 0.0f);
    EXPECT_FLOAT_EQ(shape.parameter.ValueToPosition(1.0f), 0.25f);
    EXPECT_FLOAT_EQ(shape.parameter.ValueToPosition(1.5f), 0.5f);  // first entry not below 1.5 is 2
    EXPECT_FLOAT_EQ(shape.parameter.ValueToPosition(4.0f), 1.0f);
    EXPECT_FLOAT_EQ(shape.parameter.ValueToPosition(4.5f), 0.0f);  // above the last entry: 0, not 1
    EXPECT_FLOAT_EQ(shape.parameter.PositionToValue(0.74f), 3.0f);
    Record one(4);  // a single entry divides by one, not by zero
    EXPECT_FLOAT_EQ(one.parameter.ValueToPosition(0.0f), 0.0f);
    EXPECT_FLOAT_EQ(one.parameter.PositionToValue(1.0f), 0.0f);
}

TEST(PluginParameter, PositionRoundTripsForEveryTaper) {
    for (std::size_t index : {0u, 1u, 3u}) {
        Record r(index);
        for (float position = 0.0f; position <= 1.0f; position += 0.25f)
            EXPECT_NEAR(r.parameter.ValueToPosition(r.parameter.PositionToValue(position)), position, 1e-5) << index;
    }
}
