// Every streaming kernel family, each form forced in turn against the
// reference form: the awkward lengths one after another, each in misaligned
// buffers with guard zones, against one whole pass of ref. Plain forms must
// agree bit for bit, NaN included; fused forms within the family's rounding
// bound, absolute for sums, in units in the last place for functions.
#include <gtest/gtest.h>

#include <cmath>
#include <functional>
#include <memory>

#include "Algorithms/BiquadLanes.h"
#include "Algorithms/BiquadPair.h"
#include "Algorithms/Blas1.h"
#include "Algorithms/CSquareMagnitude.h"
#include "Algorithms/Deinterleave.h"
#include "Algorithms/Downsampler.h"
#include "Algorithms/FIR.h"
#include "Algorithms/FIRS.h"
#include "Algorithms/Func.h"
#include "Algorithms/Interleave.h"
#include "Algorithms/LR2MS.h"
#include "Algorithms/LaneTranspose.h"
#include "Algorithms/Lpf16.h"
#include "Algorithms/Lpfm16.h"
#include "Algorithms/MS2LR.h"
#include "Algorithms/Mix.h"
#include "Algorithms/ModulatedTap.h"
#include "Algorithms/Rect2Polar.h"
#include "Algorithms/Rotor16.h"
#include "Algorithms/U15p.h"
#include "Algorithms/Upsampler.h"
#include "Algorithms/UpsamplerTruePeak_x4.h"
#include "Algorithms/Vec.h"
#include "KernelForms.h"

using namespace kerneltest;
using namespace ora::numeric;

namespace {

using Signals = std::vector<std::vector<float>>;
using In = const float* const*;
using Out = float* const*;
using Run = std::function<void(In, Out, std::size_t frames)>;
// Makes the kernel under the forced form: the form it reports, and its run.
using Maker = std::function<std::pair<std::string, Run>()>;
using Bound = std::function<double(const Signals& in, std::size_t output, std::size_t index)>;

struct Kernel {
    std::string name;
    std::size_t ins, inPerFrame, outs, outPerFrame;
    bool fusedForms;  // else the family reports the plain form of the width
    Maker make;
    Bound fusedBound = {};   // none: fused forms too must agree bit for bit
    bool alwaysRef = false;  // a shape that only the reference form takes
    float amplitude = 1.0f;
    std::int64_t fusedUlps = 0;  // element-wise functions: the fused forms' bound
};

template <class T, class Create, class Body>
Maker Use(Create create, Body body) {
    return [create, body] {
        std::shared_ptr<T> k(create());
        return std::pair<std::string, Run>{k->FormName(), [k, body](In in, Out out, std::size_t n) { body(*k, in, out, n); }};
    };
}
const auto kMono = [](auto& k, In in, Out out, std::size_t n) { k.Process(in[0], out[0], n); };
const auto kPlanar = [](auto& k, In in, Out out, std::size_t n) { k.Process(in, out, n); };

Bound Within(double bound) {
    return [bound](const Signals&, std::size_t, std::size_t) { return bound; };
}

// A fused form may round each tap's product once less: within 2 ULPs per tap
// of the sum of |h x|, the size of the terms summed.
Bound FusedFir(const std::vector<float>& h) {
    return [h](const Signals& in, std::size_t c, std::size_t n) {
        double scale = 0.0;
        for (std::size_t k = 0; k < h.size() && k <= n; ++k) scale += std::fabs(double(h[k]) * in[c][n - k]);
        return static_cast<double>(h.size()) * std::ldexp(scale, -22);
    };
}

// Stateful kernels whose owner keeps the state, carried across the chunks.
struct Rotor {
    Rotor16 kernel;
    Rotor16State state;
    Rotor() {
        for (std::size_t k = 0; k < 16; ++k) {
            state.c[k] = std::cos(0.4f * static_cast<float>(k));
            state.s[k] = std::sin(0.4f * static_cast<float>(k));
            state.rc[k] = std::cos(0.01f + 0.02f * static_cast<float>(k));
            state.rs[k] = std::sin(0.01f + 0.02f * static_cast<float>(k));
        }
    }
    const char* FormName() const { return kernel.FormName(); }
};

struct Biquads {
    BiquadPair kernel;
    BiquadPairState state;
    const char* FormName() const { return kernel.FormName(); }
};

// Lanes that differ in both sections; one keeps a wire as its second.
struct Lanes {
    BiquadLanes kernel;
    std::vector<BiquadLane> lanes;
    std::vector<BiquadLane*> pointers;
    explicit Lanes(std::size_t count) : lanes(count) {
        for (std::size_t l = 0; l < count; ++l) {
            const double d = 0.05 * static_cast<double>(l);
            lanes[l].sections[0] = {-0.6 + d, 1.5 - d, 0.5, -0.3 + d, 0.2 + d};
            if (l != 2) lanes[l].sections[1] = {-0.3, 0.2 + d, 1.0 - d, 2.0, 0.7 - d};
            pointers.push_back(&lanes[l]);
        }
    }
    const char* FormName() const { return kernel.FormName(); }
};

// A tap over a line that moves on with every chunk: the line holds the
// history the tap reads back into, well before the chunk's first frame.
struct Tap {
    static constexpr std::size_t kHistory = 64;
    ModulatedTap kernel;
    std::vector<float> line = RandomFloats(kHistory + AwkwardTotal(), 77);
    std::size_t position = 0;
    const char* FormName() const { return kernel.FormName(); }
};

struct MidSide {
    LR2MS to;
    MS2LR back;
    std::string FormName() const { return to.FormName() == std::string(back.FormName()) ? to.FormName() : "mixed"; }
};

std::vector<Kernel> Kernels() {
    std::vector<Kernel> all;
    all.push_back({"MidSideAndBackInPlace", 2, 1, 4, 1, false,
                   Use<MidSide>([] { return new MidSide; }, [](MidSide& k, In in, Out out, std::size_t n) {
                       k.to.Process(in[0], in[1], out[0], out[1], n);
                       std::copy_n(in[0], n, out[2]);
                       std::copy_n(in[1], n, out[3]);
                       k.back.Process(out[2], out[3], out[2], out[3], n);
                   })});
    for (std::size_t count : {1u, 3u, 8u}) {
        std::vector<float> weights;
        for (std::size_t i = 0; i < count; ++i) weights.push_back(0.3f * static_cast<float>(i) - 0.7f);
        all.push_back({"Mix" + std::to_string(count), count, 1, 1, 1, false,
                       Use<Mix>([weights] { return new Mix(MixConfig{weights}); },
                                [](Mix& k, In in, Out out, std::size_t n) { k.Process(in, out[0], n); })});
    }
    all.push_back({"InterleaveTwo", 2, 1, 1, 2, false,
                   Use<Interleave>([] { return new Interleave(InterleaveConfig{2}); },
                                   [](Interleave& k, In in, Out out, std::size_t n) { k.Process(in, out[0], n); })});
    all.push_back({"DeinterleaveTwo", 1, 2, 2, 1, false,
                   Use<Deinterleave>([] { return new Deinterleave(DeinterleaveConfig{2}); },
                                     [](Deinterleave& k, In in, Out out, std::size_t n) { k.Process(in[0], out, n); })});
    using Op = std::function<void(const Vec&, const float*, const float*, float*, std::size_t)>;
    for (const auto& [name, op] : std::vector<std::pair<const char*, Op>>{
             {"Add", [](const Vec& v, auto a, auto b, auto o, std::size_t n) { v.Add(a, b, o, n); }},
             {"Subtract", [](const Vec& v, auto a, auto b, auto o, std::size_t n) { v.Subtract(a, b, o, n); }},
             {"Multiply", [](const Vec& v, auto a, auto b, auto o, std::size_t n) { v.Multiply(a, b, o, n); }},
             {"Scale", [](const Vec& v, auto a, auto, auto o, std::size_t n) { v.Scale(a, -1.7f, o, n); }},
             {"Abs", [](const Vec& v, auto a, auto, auto o, std::size_t n) { v.Abs(a, o, n); }},
             {"Clamp", [](const Vec& v, auto a, auto, auto o, std::size_t n) { v.Clamp(a, -0.5f, 0.25f, o, n); }},
             {"Sanitize", [](const Vec& v, auto a, auto, auto o, std::size_t n) { v.Sanitize(a, 0.25f, o, n); }}})
        all.push_back({std::string("Vec") + name + "AndInPlace", 2, 1, 2, 1, false,
                       Use<Vec>([] { return new Vec; }, [op = op](Vec& k, In in, Out out, std::size_t n) {
                           op(k, in[0], in[1], out[0], n);
                           std::copy_n(in[0], n, out[1]);
                           op(k, out[1], in[1], out[1], n);
                       })});
    all.push_back({"Axpy", 2, 1, 1, 1, false, Use<Blas1>([] { return new Blas1; }, [](Blas1& k, In in, Out out, std::size_t n) {
                       std::copy_n(in[1], n, out[0]);
                       k.Axpy(-0.3f, in[0], out[0], n);
                   })});
    for (std::size_t taps : {1u, 2u, 7u, 16u, 33u})
        for (std::size_t channels : {1u, 2u, 3u}) {
            const std::vector<float> h = RandomFloats(taps, static_cast<std::uint32_t>(taps));
            all.push_back({"FIR" + std::to_string(taps) + "Taps" + std::to_string(channels) + "Channels", channels, 1,
                           channels, 1, true,
                           Use<FIR>([h, channels] { return new FIR(FIRConfig{static_cast<int>(channels), h}); }, kPlanar),
                           FusedFir(h), channels > 2});
        }
    for (std::size_t length : {1u, 6u, 31u})
        for (std::size_t channels : {1u, 2u}) {
            const std::vector<float> half = RandomFloats((length + 1) / 2, 40);
            all.push_back({"FIRS" + std::to_string(length) + "Taps" + std::to_string(channels) + "Channels", channels, 1,
                           channels, 1, true,
                           Use<FIRS>([half, length, channels] {
                               return new FIRS(FIRSConfig{static_cast<int>(channels), half, length});
                           }, kPlanar),
                           FusedFir(Symmetric(half, length))});
        }
    for (std::size_t factor : {2u, 4u, 8u})
        all.push_back({"Upsampler" + std::to_string(factor), 1, 1, 1, factor, true,
                       Use<Upsampler>([factor] { return new Upsampler({factor, 12, {}, 1, AwkwardTotal()}); }, kMono),
                       Within(1e-5)});
    // A frame of the down-samplers is `factor` input samples.
    for (std::size_t factor : {2u, 4u})
        all.push_back({"Downsampler" + std::to_string(factor), 1, factor, 1, 1, true,
                       Use<Downsampler>([factor] { return new Downsampler({factor, 12, {}, 1, factor * AwkwardTotal()}); },
                                        [factor](Downsampler& k, In in, Out out, std::size_t n) {
                                            k.Process(in[0], out[0], n * factor);
                                        }),
                       Within(1e-5)});
    for (TruePeakFilter filter : {TruePeakFilter::Standard, TruePeakFilter::Wideband}) {
        // Inputs below 1: a fused form stays within 2 ULPs of the sum of |taps| per tap.
        const std::size_t taps = UpsamplerTruePeak_x4::TapsPerPhase(filter);
        double sumOfTaps = 0.0;
        for (std::size_t i = 0; i < 3 * taps; ++i) sumOfTaps += std::fabs(UpsamplerTruePeak_x4::PhaseTaps(filter)[i]);
        all.push_back(
            {std::string("UpsamplerTruePeak") + (filter == TruePeakFilter::Standard ? "Standard" : "Wideband"), 1, 1,
             1, 4, true,
             Use<UpsamplerTruePeak_x4>([filter] { return new UpsamplerTruePeak_x4(UpsamplerTruePeakConfig{1, filter}); },
                                       kMono),
             Within(static_cast<double>(taps) * std::ldexp(sumOfTaps, -22))});
    }
    std::vector<float> c(16), g(16);
    for (std::size_t i = 0; i < 16; ++i) {
        c[i] = -0.9f * static_cast<float>(i) / 15.0f;
        g[i] = 0.5f + 0.03f * static_cast<float>(i);
    }
    all.push_back({"Lpf16", 1, 16, 1, 16, true, Use<Lpf16>([c, g] {
                       auto* k = new Lpf16;
                       k->SetCoefficients(c.data(), g.data());
                       return k;
                   }, kMono), Within(2e-6)});
    all.push_back({"Lpfm16", 1, 16, 1, 16, true, Use<Lpfm16>([c] {
                       auto* k = new Lpfm16;
                       k->SetCoefficients(c.data());
                       return k;
                   }, kMono), Within(2e-6)});
    all.push_back({"CSquareMagnitude", 1, 2, 1, 1, false,
                   Use<CSquareMagnitude>([] { return new CSquareMagnitude; },
                                         [](CSquareMagnitude& k, In in, Out out, std::size_t n) { k.Process(in[0], out[0], n); }),
                   {}, false, 1e10f});
    all.push_back({"Rect2Polar", 1, 2, 2, 1, false, Use<Rect2Polar>([] { return new Rect2Polar; }, [](Rect2Polar& k, In in, Out out, std::size_t n) {
                       k.Process(in[0], out[0], out[1], n);
                   })});
    using Function = void (Func::*)(const float*, float*, std::size_t) const noexcept;
    struct FuncCase {
        const char* name;
        Function function;
        float amplitude;  // inputs from -amplitude to amplitude: the whole range of results
    };
    for (const FuncCase& f : {FuncCase{"Log10", &Func::Log10, 1e3f}, FuncCase{"Pow10", &Func::Pow10, 50.0f},
                              FuncCase{"Exp", &Func::Exp, 110.0f}, FuncCase{"Tanh", &Func::Tanh, 12.0f},
                              FuncCase{"Sqrt", &Func::Sqrt, 1e3f}})
        all.push_back({std::string("Func") + f.name + "AndInPlace", 1, 1, 2, 1, true,
                       Use<Func>([] { return new Func; }, [function = f.function](Func& k, In in, Out out, std::size_t n) {
                           (k.*function)(in[0], out[0], n);
                           std::copy_n(in[0], n, out[1]);
                           (k.*function)(out[1], out[1], n);
                       }),
                       {}, false, f.amplitude, 2});
    all.push_back({"U15pAndInPlace", 2, 16, 2, 16, false, Use<U15p>([] { return new U15p; }, [](U15p& k, In in, Out out, std::size_t n) {
                       k.Process(in[0], in[1], out[0], n);
                       std::copy_n(in[0], 16 * n, out[1]);
                       k.Process(out[1], in[1], out[1], n);
                   }), {}, false, 3.0f});
    all.push_back({"LaneTransposeToFrames", 16, 1, 1, 16, false,
                   Use<LaneTranspose>([] { return new LaneTranspose; }, [](LaneTranspose& k, In in, Out out, std::size_t n) {
                       k.ToFrames(in, out[0], n);
                   })});
    all.push_back({"LaneTransposeFromFrames", 1, 16, 16, 1, false,
                   Use<LaneTranspose>([] { return new LaneTranspose; }, [](LaneTranspose& k, In in, Out out, std::size_t n) {
                       k.FromFrames(in[0], out, n);
                   })});
    all.push_back({"Rotor16", 0, 1, 1, 16, false, Use<Rotor>([] { return new Rotor; }, [](Rotor& k, In, Out out, std::size_t n) {
                       k.kernel.Process(k.state, out[0], n);
                   })});
    // A small swing keeps the whole delay put for whole vectors; a wide one moves it every frame.
    for (const auto& [name, depth] : {std::pair{"Settled", 0.3f}, std::pair{"Sweeping", 7.5f}})
        all.push_back({std::string("ModulatedTap") + name + "AndAccumulating", 2, 1, 2, 1, false,
                       Use<Tap>([] { return new Tap; }, [depth = depth](Tap& k, In in, Out out, std::size_t n) {
                           const float* x = k.line.data() + Tap::kHistory + k.position;
                           k.kernel.Read(x, in[0], 20.5f, depth, -0.7f, out[0], n, false);
                           std::copy_n(in[1], n, out[1]);
                           k.kernel.Read(x, in[0], 3.0f, depth, 1.3f, out[1], n, true);
                           k.position += n;
                       })});
    for (std::size_t lanes : {1u, 2u, 3u, 4u, 7u})
        all.push_back({"BiquadPair" + std::to_string(lanes) + "Lanes", lanes, 1, lanes, 1, false,
                       Use<Biquads>([] { return new Biquads; }, [lanes](Biquads& k, In in, Out out, std::size_t n) {
                           const BiquadSection sections[2] = {{-0.6, 1.5, 0.5, -0.3, 0.2}, {-0.3, 0.2, 1.0, 2.0, 0.7}};
                           for (std::size_t l = 0; l < lanes; ++l) std::copy_n(in[l], n, out[l]);
                           k.kernel.Process(sections, k.state, out, lanes, n);
                       })});
    for (std::size_t lanes : {1u, 2u, 3u, 4u, 5u, 7u, 9u})
        all.push_back({"BiquadLanes" + std::to_string(lanes), lanes, 1, lanes, 1, false,
                       Use<Lanes>([lanes] { return new Lanes(lanes); }, [lanes](Lanes& k, In in, Out out, std::size_t n) {
                           for (std::size_t l = 0; l < lanes; ++l) std::copy_n(in[l], n, out[l]);
                           k.kernel.Process(k.pointers.data(), out, lanes, n);
                       })});
    return all;
}

template <class Buffers>
std::vector<float*> Pointers(Buffers& buffers) {
    std::vector<float*> p;
    for (auto& b : buffers) p.push_back(b.data());
    return p;
}

class EveryForm : public testing::TestWithParam<Kernel> {};

}  // namespace

TEST_P(EveryForm, GivesTheReferenceResultInAwkwardMisalignedChunks) {
    const Kernel& k = GetParam();
    const std::size_t total = AwkwardTotal();
    Signals in, want(k.outs, std::vector<float>(total * k.outPerFrame, 0.0f));
    for (std::size_t i = 0; i < k.ins; ++i)
        in.push_back(RandomFloats(total * k.inPerFrame, static_cast<std::uint32_t>(i + 1), k.amplitude));
    // NaN must take the same path in every form (filters would spread it over their length).
    if (k.ins > 0 && !k.fusedBound) in[0][3] = std::nanf("");
    {
        ora::system::ScopedDispatch forced(InstructionLevel::None, false);
        const auto [name, run] = k.make();
        ASSERT_EQ(name, "ref");
        auto inputs = Pointers(in);
        run(inputs.data(), Pointers(want).data(), total);
    }
    ForEachForm(k.fusedForms, [&](const Form& form, const std::string& expected) {
        const auto [name, run] = k.make();
        EXPECT_EQ(name, k.alwaysRef ? "ref" : expected);
        const bool fused = Fused(form.form) && !k.alwaysRef && (k.fusedBound || k.fusedUlps > 0);
        std::size_t position = 0;
        for (std::size_t n : AwkwardLengths()) {
            std::vector<Guarded<>> gi, go;
            for (std::size_t i = 0; i < k.ins; ++i) {
                gi.emplace_back(n * k.inPerFrame);
                std::copy_n(&in[i][position * k.inPerFrame], n * k.inPerFrame, gi.back().data());
            }
            for (std::size_t o = 0; o < k.outs; ++o) go.emplace_back(n * k.outPerFrame);
            run(Pointers(gi).data(), Pointers(go).data(), n);
            for (std::size_t o = 0; o < k.outs; ++o) {
                ASSERT_TRUE(go[o].GuardsIntact()) << name << " output " << o << " length " << n;
                for (std::size_t i = 0; i < n * k.outPerFrame; ++i) {
                    const std::size_t at = position * k.outPerFrame + i;
                    const float got = go[o][i], w = want[o][at];
                    const bool same = got == w || (std::isnan(got) && std::isnan(w));
                    if (fused && k.fusedUlps > 0)
                        ASSERT_TRUE(same || UlpDistance(got, w) <= k.fusedUlps) << name << " " << o << " at " << at
                                                                                << ": " << got << " vs " << w;
                    else if (fused)
                        ASSERT_LE(std::fabs(double(got) - w), k.fusedBound(in, o, at)) << name << " " << o << " at " << at;
                    else
                        ASSERT_TRUE(same) << name << " " << o << " at " << at << ": " << got << " vs " << w;
                }
            }
            position += n;
        }
    });
}

INSTANTIATE_TEST_SUITE_P(Kernels, EveryForm, testing::ValuesIn(Kernels()),
                         [](const testing::TestParamInfo<Kernel>& p) { return p.param.name; });
