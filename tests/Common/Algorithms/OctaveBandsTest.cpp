// OctaveBands: the base-10 third-octave bands, and every bin of a spectrum
// counted once among them.
#include <gtest/gtest.h>

#include <cmath>
#include <vector>

#include "Common/Algorithms/OctaveBands.h"

using zen::OctaveBands;

TEST(OctaveBands, BandsAreTheNominalThirdOctavesEdgeToEdge) {
    const double nominal[] = {20, 25, 31.5, 40, 50, 63, 80, 100, 125, 160, 200, 250, 315, 400, 500, 630,
                              800, 1000, 1250, 1600, 2000, 2500, 3150, 4000, 5000, 6300, 8000, 10000, 12500, 16000, 20000};
    for (std::size_t b = 0; b < OctaveBands::kBands; ++b) {
        EXPECT_NEAR(OctaveBands::Centre(b) / nominal[b], 1.0, 0.015) << b;
        EXPECT_NEAR(OctaveBands::UpperEdge(b) / OctaveBands::LowerEdge(b), std::pow(10.0, 0.1), 1e-12);
        if (b > 0) {
            EXPECT_NEAR(OctaveBands::LowerEdge(b), OctaveBands::UpperEdge(b - 1), 1e-9);
        }
    }
}

TEST(OctaveBands, EveryBinCountsOnceAcrossTheBands) {
    for (double rate : {32000.0, 48000.0, 96000.0})
        for (std::size_t size : {1024u, 4096u, 32768u}) {
            OctaveBands bands;
            bands.Configure(rate, size);
            const std::size_t bins = size / 2 + 1;
            const double binWidth = rate / static_cast<double>(size);
            // A flat spectrum: the bands hold the width they cover, in bins.
            std::vector<float> flat(bins, 1.0f), out(OctaveBands::kBands);
            bands.Compute(flat.data(), out.data());
            for (std::size_t b = 0; b < OctaveBands::kBands; ++b) {
                const double lo = OctaveBands::LowerEdge(b);
                const double hi = std::min(OctaveBands::UpperEdge(b), (static_cast<double>(bins) - 0.5) * binWidth);
                const double covered = std::max(0.0, hi - lo) / binWidth;
                EXPECT_NEAR(out[b], covered, 1e-3 * covered + 1e-6)
                    << rate << " " << size << " band " << b;
            }
            // One bin alone lands, whole, in the bands around its frequency.
            for (std::size_t k : {std::size_t{3}, bins / 7, bins / 2, bins - 2}) {
                std::vector<float> one(bins, 0.0f);
                one[k] = 1.0f;
                bands.Compute(one.data(), out.data());
                double total = 0.0;
                for (float v : out) total += v;
                const double f = static_cast<double>(k) * binWidth;
                if (f > OctaveBands::LowerEdge(0) + binWidth && f < OctaveBands::UpperEdge(30) - binWidth) {
                    EXPECT_NEAR(total, 1.0, 1e-5) << rate << " " << size << " bin " << k;
                }
            }
        }
}
