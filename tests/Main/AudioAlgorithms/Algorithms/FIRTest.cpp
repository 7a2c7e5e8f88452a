// FIR and FIRS: impulse responses, history across blocks and
// reconfiguration (the forms are in FormEquivalenceTest).
#include <gtest/gtest.h>

#include <cmath>

#include "Algorithms/FIR.h"
#include "Algorithms/FIRS.h"
#include "KernelForms.h"

using namespace kerneltest;
using ora::numeric::FIR;
using ora::numeric::FIRConfig;
using ora::numeric::FIRS;
using ora::numeric::FIRSConfig;
using ora::system::ScopedDispatch;

TEST(FIR, ImpulseResponseIsTheCoefficientsAndBlocksJoin) {
    const std::vector<float> h = RandomFloats(37, 3);
    std::vector<float> x(200, 0.0f);
    x[0] = 1.0f;
    x[100] = -2.0f;
    FIR filter(FIRConfig{1, h});
    std::vector<float> y(x.size());
    // Uneven blocks cross the chunk and history boundaries.
    for (std::size_t done = 0, block = 1; done < x.size(); done += block, block = block * 3 % 61 + 1)
        filter.Process(x.data() + done, y.data() + done, std::min(block, x.size() - done));
    for (std::size_t n = 0; n < y.size(); ++n) {
        const float expected = (n < 37 ? h[n] : 0.0f) + (n >= 100 && n < 137 ? -2.0f * h[n - 100] : 0.0f);
        EXPECT_FLOAT_EQ(y[n], expected) << n;
    }
}

TEST(FIR, ReconfigureKeepsHistoryAndRebuildsOnChannelChange) {
    // Plain forms only, so that the rebuilt ref form must match bit for bit.
    ScopedDispatch forced(InstructionLevel::SSE2, false);
    const std::vector<float> x = RandomFloats(300, 5);
    const std::vector<float> a = RandomFloats(9, 1), b = RandomFloats(9, 2);
    // Switching coefficients mid-stream: the history stays, so the first
    // outputs after the switch already use the old inputs.
    FIR switched(FIRConfig{1, a});
    std::vector<float> y(300);
    switched.Process(x.data(), y.data(), 150);
    switched.Reconfigure(FIRConfig{1, b});
    switched.Process(x.data() + 150, y.data() + 150, 150);
    FIR whole(FIRConfig{1, b});
    std::vector<float> z(300);
    whole.Process(x.data(), z.data(), 300);
    for (std::size_t n = 150; n < 300; ++n) EXPECT_EQ(y[n], z[n]) << n;

    // A new channel count rebuilds the implementation: three channels use
    // ref, and channel 0 continues from the history handed over.
    FIR grown(FIRConfig{1, a});
    grown.Process(x.data(), y.data(), 150);
    grown.Reconfigure(FIRConfig{3, a});
    EXPECT_STREQ(grown.FormName(), "ref");
    std::vector<float> c1(150, 0.0f), c2(150, 0.0f), c0(150);
    const float* in[3] = {x.data() + 150, c1.data(), c2.data()};
    float* out[3] = {c0.data(), c1.data(), c2.data()};
    grown.Process(in, out, 150);
    FIR single(FIRConfig{1, a});
    single.Process(x.data(), z.data(), 300);
    for (std::size_t n = 0; n < 150; ++n) EXPECT_EQ(c0[n], z[150 + n]) << n;
    EXPECT_TRUE(grown == FIR(FIRConfig{3, a}));
    EXPECT_FALSE(grown == FIR(FIRConfig{3, b}));

    grown.Reset();
    grown.Process(in, out, 150);
    EXPECT_EQ(c0[0], a[0] * x[150]);
}

TEST(FIRS, MatchesTheFullFilterForOddAndEvenLengths) {
    for (std::size_t length : {1u, 2u, 15u, 16u, 63u}) {
        const std::vector<float> half = RandomFloats((length + 1) / 2, static_cast<std::uint32_t>(length));
        const std::vector<float> h = Symmetric(half, length);
        const std::vector<float> x = RandomFloats(700, 8);
        FIRS symmetric(FIRSConfig{1, half, length});
        FIR full(FIRConfig{1, h});
        std::vector<float> ys(x.size()), yf(x.size());
        symmetric.Process(x.data(), ys.data(), x.size());
        full.Process(x.data(), yf.data(), x.size());
        for (std::size_t n = 0; n < x.size(); ++n)
            EXPECT_NEAR(ys[n], yf[n], 1e-5) << "length " << length << " at " << n;
        EXPECT_EQ(symmetric.GetLatency(), (length - 1) / 2);
    }
}
