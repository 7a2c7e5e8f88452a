// Analysis and dual synthesis windows.
#include <gtest/gtest.h>

#include "../System/CheckRecorder.h"
#include <algorithm>
#include <cmath>
#include <complex>
#include <vector>

#include "FFT/Window.h"

using namespace ora::fft;
using zentest::CheckRecorder;

TEST(Window, DualWindowsReconstructAtTheirStride) {
    for (std::size_t stride : {256u, 512u, 1024u, 2048u}) {
        const std::size_t len = 4096;
        Window window;
        ASSERT_TRUE(window.Build(len, stride));
        // Overlap-added products sum to one at every sample.
        for (std::size_t n = 0; n < stride; ++n) {
            double sum = 0.0;
            for (std::size_t m = n; m < len; m += stride) sum += window.Analysis()[m] * window.Dual()[m];
            EXPECT_NEAR(sum, 1.0, 1e-6) << "stride " << stride << " sample " << n;
        }
    }
    CheckRecorder checks;
    float a[4], b[4];
    EXPECT_FALSE(Window::MakePair(a, b, 4, 0));
    EXPECT_FALSE(Window::MakePair(nullptr, b, 4, 2));
    ASSERT_EQ(checks.Checks().size(), 2u);
    EXPECT_EQ(checks.Checks()[0], "(win != nullptr) && (win_dual != nullptr) && (stride > 0u) && (len > 0u)");
}

TEST(Window, AnalysisWindowsHaveTheirNoiseBandwidthsAndSideLobes) {
    // Equivalent noise bandwidth in bins, N sum(w^2) / sum(w)^2, and the
    // highest side lobe of each shape beyond its main lobe (half width in
    // bins), from a zero-padded transform.
    struct Shape {
        const char* name;
        void (*make)(float*, std::size_t);
        double bandwidth, sideLobeDb;
        std::size_t mainLobe;
    } shapes[] = {{"rectangular", Window::Rectangular, 1.0, -13.26, 1},
                  {"Hann", Window::Hann, 1.5, -31.47, 2},
                  {"Blackman-Harris", Window::BlackmanHarris, 2.0044, -92.0, 4},
                  {"flat top", Window::FlatTop, 3.7702, -93.0, 5}};
    const std::size_t n = 256, pad = 16;
    for (const Shape& s : shapes) {
        std::vector<float> w(n);
        s.make(w.data(), n);
        double sum = 0.0, squares = 0.0;
        for (float v : w) {
            sum += v;
            squares += static_cast<double>(v) * v;
        }
        EXPECT_NEAR(static_cast<double>(n) * squares / (sum * sum), s.bandwidth, 0.002) << s.name;
        // The spectrum beyond the main lobe's first null, relative to its peak.
        std::vector<double> db;
        for (std::size_t k = 0; k <= n * pad / 2; ++k) {
            std::complex<double> x = 0.0;
            for (std::size_t m = 0; m < n; ++m)
                x += static_cast<double>(w[m]) * std::polar(1.0, -2.0 * M_PI * double(k * m) / double(n * pad));
            db.push_back(20.0 * std::log10(std::abs(x) / sum + 1e-30));
        }
        const auto k = static_cast<std::ptrdiff_t>(s.mainLobe * pad);
        const double highest = *std::max_element(db.begin() + k, db.end());
        EXPECT_NEAR(highest, s.sideLobeDb, 1.0) << s.name;
    }
}
