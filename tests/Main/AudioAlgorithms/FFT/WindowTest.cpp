// Analysis and dual synthesis windows.
#include <gtest/gtest.h>

#include "../System/CheckRecorder.h"
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
