// FIR and FIRS: impulse responses, history across blocks, reconfiguration,
// and every form against ref.
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

namespace {

// A fused form may round each tap's product once less: it stays within
// 2 ULPs per tap of the sum of |h x|, the size of the terms summed.
double FusedBound(const std::vector<float>& h, const std::vector<float>& x, std::size_t n) {
    double scale = 0.0;
    for (std::size_t k = 0; k < h.size() && k <= n; ++k) scale += std::fabs(double(h[k]) * x[n - k]);
    return static_cast<double>(h.size()) * std::ldexp(scale, -22);
}

std::vector<float> Taps(std::size_t count, std::uint32_t seed) { return RandomFloats(count, seed); }

std::vector<float> Symmetric(const std::vector<float>& half, std::size_t length) {
    std::vector<float> h(length);
    for (std::size_t k = 0; k < length; ++k) h[k] = half[std::min(k, length - 1 - k)];
    return h;
}

}  // namespace

TEST(FIR, ImpulseResponseIsTheCoefficientsAndBlocksJoin) {
    const std::vector<float> h = Taps(37, 3);
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

TEST(FIR, EveryFormGivesTheReferenceResult) {
    for (std::size_t taps : {1u, 2u, 7u, 16u, 33u}) {
        const std::vector<float> h = Taps(taps, static_cast<std::uint32_t>(taps));
        for (int channels : {1, 2, 3}) {
            const std::size_t total = AwkwardTotal();
            std::vector<std::vector<float>> input, reference;
            for (int c = 0; c < channels; ++c) input.push_back(RandomFloats(total, 10 + c));
            reference = input;
            {
                ScopedDispatch forced(InstructionLevel::None, false);
                FIR ref(FIRConfig{channels, h});
                ASSERT_STREQ(ref.FormName(), "ref");
                std::vector<float*> io;
                for (auto& r : reference) io.push_back(r.data());
                ref.Process(io.data(), io.data(), total);
            }
            for (const Form& form : AllForms()) {
                if (!Runnable(form)) continue;
                ScopedDispatch forced(form.level, form.fma);
                const char* name = ora::system::KernelFormName(form.form);
                FIR filter(FIRConfig{channels, h});
                EXPECT_STREQ(filter.FormName(), channels <= 2 ? name : "ref");
                // Awkward lengths one after another, each into a misaligned, guarded buffer.
                std::size_t position = 0;
                for (std::size_t length : AwkwardLengths()) {
                    std::vector<Guarded<>> in, out;
                    for (int c = 0; c < channels; ++c) {
                        in.emplace_back(length);
                        out.emplace_back(length);
                        std::copy_n(input[c].begin() + position, length, in.back().data());
                    }
                    std::vector<const float*> ip;
                    std::vector<float*> op;
                    for (int c = 0; c < channels; ++c) {
                        ip.push_back(in[c].data());
                        op.push_back(out[c].data());
                    }
                    filter.Process(ip.data(), op.data(), length);
                    for (int c = 0; c < channels; ++c) {
                        ASSERT_TRUE(out[c].GuardsIntact()) << name << " length " << length;
                        for (std::size_t i = 0; i < length; ++i) {
                            const float expected = reference[c][position + i];
                            if (Fused(form.form) && channels <= 2) {
                                const double bound = FusedBound(h, input[c], position + i);
                                ASSERT_LE(std::fabs(double(out[c][i]) - expected), bound)
                                    << name << " taps " << taps << " at " << position + i;
                            } else {
                                ASSERT_EQ(out[c][i], expected)
                                    << name << " taps " << taps << " at " << position + i;
                            }
                        }
                    }
                    position += length;
                }
            }
        }
    }
}

TEST(FIR, ReconfigureKeepsHistoryAndRebuildsOnChannelChange) {
    // Plain forms only, so that the rebuilt ref form must match bit for bit.
    ScopedDispatch forced(InstructionLevel::SSE2, false);
    const std::vector<float> x = RandomFloats(300, 5);
    const std::vector<float> a = Taps(9, 1), b = Taps(9, 2);
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
        const std::vector<float> half = Taps((length + 1) / 2, static_cast<std::uint32_t>(length));
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

TEST(FIRS, EveryFormGivesTheReferenceResult) {
    for (std::size_t length : {1u, 6u, 31u}) {
        const std::vector<float> half = Taps((length + 1) / 2, 40);
        const std::vector<float> h = Symmetric(half, length);
        for (int channels : {1, 2}) {
            const std::size_t total = AwkwardTotal();
            const std::vector<float> x0 = RandomFloats(total, 1), x1 = RandomFloats(total, 2);
            std::vector<float> r0(total), r1(total);
            {
                ScopedDispatch forced(InstructionLevel::None, false);
                FIRS ref(FIRSConfig{channels, half, length});
                const float* in[2] = {x0.data(), x1.data()};
                float* out[2] = {r0.data(), r1.data()};
                ref.Process(in, out, total);
            }
            for (const Form& form : AllForms()) {
                if (!Runnable(form)) continue;
                ScopedDispatch forced(form.level, form.fma);
                const char* name = ora::system::KernelFormName(form.form);
                FIRS filter(FIRSConfig{channels, half, length});
                EXPECT_STREQ(filter.FormName(), name);
                std::size_t position = 0;
                for (std::size_t n : AwkwardLengths()) {
                    Guarded<> i0(n), i1(n), o0(n), o1(n);
                    std::copy_n(x0.begin() + position, n, i0.data());
                    std::copy_n(x1.begin() + position, n, i1.data());
                    const float* in[2] = {i0.data(), i1.data()};
                    float* out[2] = {o0.data(), o1.data()};
                    filter.Process(in, out, n);
                    ASSERT_TRUE(o0.GuardsIntact() && o1.GuardsIntact());
                    for (std::size_t i = 0; i < n; ++i) {
                        for (int c = 0; c < channels; ++c) {
                            const float got = c == 0 ? o0[i] : o1[i];
                            const float want = c == 0 ? r0[position + i] : r1[position + i];
                            if (Fused(form.form))
                                ASSERT_LE(std::fabs(double(got) - want), FusedBound(h, c == 0 ? x0 : x1, position + i))
                                    << name;
                            else
                                ASSERT_EQ(got, want) << name << " length " << length << " at " << position + i;
                        }
                    }
                    position += n;
                }
            }
        }
    }
}
