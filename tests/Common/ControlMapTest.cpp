// ControlMap over SmoothedRamp: a moving control reaches its algorithm
// parameters through their lines at each control point, a resting one only
// once after Forget.
#include <gtest/gtest.h>

#include "Common/Algorithms/BiQuad.h"
#include "Common/ControlMap.h"
#include "Common/SmoothedValueGroup.h"

TEST(ControlMap, HandsOnMovedControlsThroughTheirLines) {
    zen::SmoothedValueGroup group(1, 0.5f);
    zen::SmoothedRamp ramps[1];
    ramps[0].Prepare(64);
    BiQuad filter;
    zen::ControlMap map;
    map.Add({0, &filter, BiQuad::kGain, 10.0f, -3.0f});  // one control, two parameters
    map.Add({0, &filter, BiQuad::kFreq, 1000.0f, 500.0f});

    ramps[0].Read(group, 64);
    EXPECT_TRUE(ramps[0].IsConstant());
    EXPECT_FALSE(map.Settled(ramps));  // nothing handed on yet
    map.Apply(ramps, 0);
    EXPECT_EQ(filter.GetParameter(BiQuad::kGain), 2.0f);
    EXPECT_EQ(filter.GetParameter(BiQuad::kFreq), 1000.0f);
    EXPECT_TRUE(map.Settled(ramps));

    filter.SetParameter(BiQuad::kGain, 0.0f);
    map.Apply(ramps, 32);  // unmoved: left alone
    EXPECT_EQ(filter.GetParameter(BiQuad::kGain), 0.0f);
    ramps[0].Forget();
    map.Apply(ramps, 32);
    EXPECT_EQ(filter.GetParameter(BiQuad::kGain), 2.0f);

    group[0].target.store(1.0f);  // moving: per-sample values, handed on where they changed
    ramps[0].Read(group, 64);
    EXPECT_FALSE(ramps[0].IsConstant());
    EXPECT_FALSE(map.Settled(ramps));
    map.Apply(ramps, 63);
    EXPECT_EQ(filter.GetParameter(BiQuad::kGain), 10.0f * ramps[0][63] - 3.0f);
}
