// Rotor16 against the sines it stands for, and the transposition of lane frames.
#include <gtest/gtest.h>

#include <cmath>
#include <vector>

#include "Algorithms/LaneTranspose.h"
#include "Algorithms/Rotor16.h"

using namespace ora::numeric;

TEST(Rotor16, EachLaneIsASineOfItsOwnRateAndPhase) {
    Rotor16State state;
    for (int k = 0; k < 16; ++k) {
        state.c[k] = static_cast<float>(std::cos(0.3 * k));
        state.s[k] = static_cast<float>(std::sin(0.3 * k));
        state.rc[k] = static_cast<float>(std::cos(0.002 * (k + 1)));
        state.rs[k] = static_cast<float>(std::sin(0.002 * (k + 1)));
    }
    const std::size_t frames = 1000;
    std::vector<float> sines(16 * frames);
    Rotor16().Process(state, sines.data(), frames);
    for (std::size_t f = 0; f < frames; f += 111)
        for (int k = 0; k < 16; ++k)
            EXPECT_NEAR(sines[16 * f + k], std::sin(0.3 * k + 0.002 * (k + 1) * double(f + 1)), 1e-4)
                << "lane " << k << " frame " << f;
}

TEST(LaneTranspose, RowsBecomeLanesAndBack) {
    const std::size_t frames = 21;
    std::vector<std::vector<float>> rows(16, std::vector<float>(frames));
    const float* in[16];
    for (int k = 0; k < 16; ++k) {
        for (std::size_t f = 0; f < frames; ++f) rows[k][f] = float(100 * k) + float(f);
        in[k] = rows[k].data();
    }
    const LaneTranspose transpose;
    std::vector<float> lanes(16 * frames);
    transpose.ToFrames(in, lanes.data(), frames);
    EXPECT_EQ(lanes[16 * 20 + 3], 320.0f);  // frame 20, lane 3
    std::vector<std::vector<float>> back(16, std::vector<float>(frames));
    float* out[16];
    for (int k = 0; k < 16; ++k) out[k] = back[k].data();
    transpose.FromFrames(lanes.data(), out, frames);
    EXPECT_EQ(back, rows);
}
