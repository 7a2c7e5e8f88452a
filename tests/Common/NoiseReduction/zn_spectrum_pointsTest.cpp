// Spectra of any rate on the meters' fixed points: averaged where bins
// outnumber points, interpolated where points outnumber bins.
#include <gtest/gtest.h>

#include <vector>

#include "Common/NoiseReduction/zn_spectrum_points.h"

namespace nr = zen::noise_reduction;

TEST(zn_spectrum_points, KeepsLinesInPlaceAtEveryRatio) {
    // A straight line in frequency stays that line at 1x, 2x, 4x and 1/2x.
    for (std::size_t bins : {257u, 513u, 1025u, 2049u}) {
        std::vector<float> line(bins), points(513);
        for (std::size_t k = 0; k < bins; ++k) line[k] = static_cast<float>(k) / static_cast<float>(bins - 1);
        nr::zn_spectrum_points(line.data(), bins, points.data(), points.size());
        for (std::size_t p = 1; p + 1 < points.size(); ++p)
            ASSERT_NEAR(points[p], static_cast<float>(p) / 512.0f, 1e-5f) << bins << " bins, point " << p;
    }
}

TEST(zn_spectrum_points, AveragesAnIsolatedBinAndConvertsToDecibels) {
    std::vector<float> bins(1025, 1e-6f), points(513);
    bins[400] = 1.0f;  // two bins per point: bins 399 and 401 count half
    nr::zn_spectrum_points(bins.data(), bins.size(), points.data(), points.size());
    EXPECT_NEAR(points[200], (1.0f + 1e-6f) / 2.0f, 1e-6f);
    EXPECT_NEAR(points[199], 1e-6f, 1e-9f);
    EXPECT_NEAR(points[100], 1e-6f, 1e-9f);

    nr::zn_spectrum_points_db(bins.data(), bins.size(), points.data(), points.size(), 10.0f, -50.0f);
    EXPECT_NEAR(points[100], -50.0f, 1e-4f);  // -60 dB floored
    EXPECT_NEAR(points[200], -3.01f, 0.01f);
    std::vector<float> silent(1025, 0.0f);
    nr::zn_spectrum_points_db(silent.data(), silent.size(), points.data(), points.size(), 20.0f, -120.0f);
    EXPECT_EQ(points[0], -120.0f);
}
