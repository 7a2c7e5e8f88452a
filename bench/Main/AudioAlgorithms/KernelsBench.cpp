// Every kernel family in every form this processor runs, forced one by one:
// "realtime" is seconds of 48 kHz audio (one channel, or one matrix-vector
// product per frame for Gemv, one bin per frame for the complex families,
// the lags of each 512-sample block for AutoCorr) per second of CPU, so the
// forms of a family compare directly with its ref.
#include <benchmark/benchmark.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "Algorithms/AutoCorr.h"
#include "Algorithms/BiquadLanes.h"
#include "Algorithms/Blas1.h"
#include "Algorithms/Blas2.h"
#include "Algorithms/CSquareMagnitude.h"
#include "Algorithms/CastFloatInt32.h"
#include "Algorithms/Deinterleave.h"
#include "Algorithms/FIR.h"
#include "Algorithms/FIRS.h"
#include "Algorithms/FindMinMax.h"
#include "Algorithms/Func.h"
#include "Algorithms/Interleave.h"
#include "Algorithms/LR2MS.h"
#include "Algorithms/MS2LR.h"
#include "Algorithms/Mix.h"
#include "Algorithms/Rect2Polar.h"
#include "Algorithms/TruePeak.h"
#include "Algorithms/UpsamplerTruePeak_x4.h"
#include "Algorithms/Vec.h"
#include "Algorithms/random/LCG.h"
#include "Support/Realtime.h"
#include "System/AlignedBuffer.h"
#include "System/DispatchSettings.h"

namespace {

using namespace ora::numeric;
using ora::system::InstructionLevel;
using ora::system::ScopedDispatch;

constexpr std::size_t kFrames = 512;

struct Level {
    const char* name;
    InstructionLevel level;
    bool fma;
    bool integer;  // a form of the integer ladder
};

const Level kLevels[] = {
    {"ref", InstructionLevel::None, false, false},      {"m128", InstructionLevel::SSE2, false, false},
    {"m128_fma", InstructionLevel::SSE42, true, false}, {"m256", InstructionLevel::AVX, false, false},
    {"m256_fma", InstructionLevel::AVX, true, false},   {"m128_sse41", InstructionLevel::SSE41, false, true},
    {"m256_avx2", InstructionLevel::AVX2, false, true},
};

bool Runnable(const Level& level) {
    const auto& cpu = ora::system::DispatchSettings::Instance().Detected();
    if (level.fma && !(cpu.fma && cpu.osAvx)) return false;
    if (level.level >= InstructionLevel::AVX2 && !(cpu.avx2 && cpu.osAvx)) return false;
    if (level.level >= InstructionLevel::AVX && !cpu.osAvx) return false;
    return level.level < InstructionLevel::SSE41 || cpu.sse41;
}

std::vector<float> Noise(std::size_t n, std::uint32_t seed) {
    std::vector<float> x(n);
    for (float& v : x) {
        seed = seed * 1664525u + 1013904223u;
        v = static_cast<float>(static_cast<std::int32_t>(seed)) / 2147483648.0f;
    }
    return x;
}

// A family's benchmark body: built under the forced level, returns the
// step that processes kFrames frames once.
using Setup = std::function<std::function<void()>()>;

struct Family {
    const char* name;
    bool fused;    // has FMA forms
    bool integer;  // uses the integer ladder
    Setup setup;
};

// The buffers the families read and write, at fixed offsets in one block:
// where they fall relative to each other (a store 4 KiB from a later load
// stalls it) would otherwise change with every build's heap layout, and
// with it the figures of memory-bound kernels by up to 40 %.
float* Buffer(std::size_t index) {
    constexpr std::size_t kSize = 8 * kFrames, kGap = 272;  // 1088 bytes: the offsets differ modulo 4 KiB
    static ora::AlignedBuffer<float> block(7 * (kSize + kGap));
    return block.data() + index * (kSize + kGap);
}

std::vector<Family> Families() {
    float* const a = Buffer(0);
    float* const b = Buffer(1);
    float* const out = Buffer(2);
    float* const out2 = Buffer(3);
    const std::vector<float> noiseA = Noise(4 * kFrames, 1), noiseB = Noise(4 * kFrames, 2);
    std::copy(noiseA.begin(), noiseA.end(), a);
    std::copy(noiseB.begin(), noiseB.end(), b);
    std::vector<Family> families;
    families.push_back({"FIR/64 taps", true, false, [=] {
                            auto f = std::make_shared<FIR>(FIRConfig{1, Noise(64, 3)});
                            return std::function<void()>([=] { f->Process(a, out, kFrames); });
                        }});
    families.push_back({"FIR/64 taps, 2 ch", true, false, [=] {
                            auto f = std::make_shared<FIR>(FIRConfig{2, Noise(64, 3)});
                            return std::function<void()>([=] {
                                const float* in[2] = {a, b};
                                float* o[2] = {out, out2};
                                f->Process(in, o, kFrames);
                            });
                        }});
    families.push_back({"FIRS/65 taps", true, false, [=] {
                            auto f = std::make_shared<FIRS>(FIRSConfig{1, Noise(33, 4), 65});
                            return std::function<void()>([=] { f->Process(a, out, kFrames); });
                        }});
    for (TruePeakFilter filter : {TruePeakFilter::Standard, TruePeakFilter::Wideband}) {
        const bool wide = filter == TruePeakFilter::Wideband;
        families.push_back({wide ? "UpsamplerTruePeak_x4/wideband" : "UpsamplerTruePeak_x4/standard", true, false, [=] {
                                auto f = std::make_shared<UpsamplerTruePeak_x4>(UpsamplerTruePeakConfig{1, filter});
                                return std::function<void()>([=] { f->Process(a, out, kFrames); });
                            }});
        families.push_back({wide ? "TruePeak/wideband" : "TruePeak/standard", true, false, [=] {
                                auto f = std::make_shared<TruePeak>(TruePeakConfig{1, 1.0f, filter});
                                return std::function<void()>(
                                    [=] { benchmark::DoNotOptimize(f->Process(a, kFrames)); });
                            }});
    }
    families.push_back({"FindMinMax/1 ch", false, false, [=] {
                            auto f = std::make_shared<FindMinMax>();
                            return std::function<void()>([=] { f->Process(a, kFrames); });
                        }});
    families.push_back({"FindMinMax/2 ch interleaved", false, false, [=] {
                            auto f = std::make_shared<FindMinMax>(FindMinMaxConfig{2});
                            return std::function<void()>([=] { f->Process(a, kFrames); });
                        }});
    families.push_back({"LR2MS", false, false, [=] {
                            auto f = std::make_shared<LR2MS>();
                            return std::function<void()>(
                                [=] { f->Process(a, b, out, out2, kFrames); });
                        }});
    families.push_back({"MS2LR", false, false, [=] {
                            auto f = std::make_shared<MS2LR>();
                            return std::function<void()>(
                                [=] { f->Process(a, b, out, out2, kFrames); });
                        }});
    families.push_back(
        {"Mix/4 sources", false, false, [=] {
             auto f = std::make_shared<Mix>(MixConfig{{0.5f, -0.25f, 0.125f, 0.7f}});
             return std::function<void()>([=] {
                 const float* sources[4] = {a, b, a + kFrames, b + kFrames};
                 f->Process(sources, out, kFrames);
             });
         }});
    families.push_back({"Vec/Multiply", false, false, [=] {
                            auto f = std::make_shared<Vec>();
                            return std::function<void()>(
                                [=] { f->Multiply(a, b, out, kFrames); });
                        }});
    families.push_back({"Vec/Clamp", false, false, [=] {
                            auto f = std::make_shared<Vec>();
                            return std::function<void()>(
                                [=] { f->Clamp(a, -0.5f, 0.5f, out, kFrames); });
                        }});
    families.push_back({"Vec/Sanitize", false, false, [=] {
                            auto f = std::make_shared<Vec>();
                            return std::function<void()>(
                                [=] { f->Sanitize(a, 0.5f, out, kFrames); });
                        }});
    families.push_back({"Blas1/Dot", false, false, [=] {
                            auto f = std::make_shared<Blas1>();
                            return std::function<void()>(
                                [=] { benchmark::DoNotOptimize(f->Dot(a, b, kFrames)); });
                        }});
    families.push_back({"Blas2/Gemv 16x16", false, false, [=] {
                            auto f = std::make_shared<Blas2>();
                            float* const matrix = Buffer(6);
                            const std::vector<float> values = Noise(256, 5);
                            std::copy(values.begin(), values.end(), matrix);
                            return std::function<void()>([=] {
                                // One product per frame, as a 16-line mixing matrix runs.
                                for (std::size_t n = 0; n + 16 <= kFrames; n += 16)
                                    f->Gemv(matrix, 16, 16, 16, a + n, out + n);
                            });
                        }});
    families.push_back({"Interleave/2 ch", false, false, [=] {
                            auto f = std::make_shared<Interleave>(InterleaveConfig{2});
                            return std::function<void()>([=] {
                                const float* in[2] = {a, b};
                                f->Process(in, out, kFrames);
                            });
                        }});
    families.push_back({"Deinterleave/2 ch", false, false, [=] {
                            auto f = std::make_shared<Deinterleave>(DeinterleaveConfig{2});
                            return std::function<void()>([=] {
                                float* o[2] = {out, out2};
                                f->Process(a, o, kFrames);
                            });
                        }});
    families.push_back({"CastFloatInt32/ToInt32", false, false, [=] {
                            auto f = std::make_shared<CastFloatInt32>();
                            auto* ints = reinterpret_cast<std::int32_t*>(Buffer(5));
                            return std::function<void()>(
                                [=] { f->ToInt32(a, ints, kFrames, CastFloatInt32::kPcm32Scale); });
                        }});
    // A stage of a stereo five-band crossover: low and high halves of one
    // split and the all-pass corrections of two earlier bands, per channel.
    families.push_back({"BiquadLanes/8 lanes", false, false, [=] {
                            auto f = std::make_shared<BiquadLanes>();
                            auto lanes = std::make_shared<std::vector<BiquadLane>>(8);
                            auto buffers = std::make_shared<std::vector<std::vector<float>>>(8, Noise(kFrames, 6));
                            for (std::size_t l = 0; l < 8; ++l)
                                (*lanes)[l].sections[0] = (*lanes)[l].sections[1] = {-0.98, 1.98, 1.0, 2.0, 1e-4};
                            return std::function<void()>([=] {
                                BiquadLane* l[8];
                                float* x[8];
                                for (std::size_t k = 0; k < 8; ++k) {
                                    l[k] = &(*lanes)[k];
                                    x[k] = (*buffers)[k].data();
                                }
                                f->Process(l, x, 8, kFrames);
                            });
                        }});
    families.push_back({"random::LCG", false, true, [=] {
                            auto f = std::make_shared<random::LCG>();
                            return std::function<void()>([=] { f->Generate(out, kFrames); });
                        }});
    families.push_back({"AutoCorr/64 lags", true, false, [=] {
                            auto f = std::make_shared<AutoCorr>(AutoCorrConfig{64});
                            return std::function<void()>([=] { f->Process(a, kFrames, out); });
                        }});
    // Bins of magnitude about 1 to 100, as an FFT of audio gives.
    families.push_back({"CSquareMagnitude", false, false, [=] {
                            auto f = std::make_shared<CSquareMagnitude>();
                            return std::function<void()>([=] { f->Process(a, out, kFrames); });
                        }});
    families.push_back({"Rect2Polar", false, false, [=] {
                            auto f = std::make_shared<Rect2Polar>();
                            return std::function<void()>(
                                [=] { f->Process(a, out, out2, kFrames); });
                        }});
    using Function = void (Func::*)(const float*, float*, std::size_t) const noexcept;
    // Inputs as the callers have them: magnitudes for Log10, dB / 20 for
    // Pow10, levels for Exp and Tanh, powers for Sqrt.
    float* const magnitudes = Buffer(4);
    for (std::size_t i = 0; i < kFrames; ++i) magnitudes[i] = std::fabs(a[i]) + 1e-6f;
    const struct {
        const char* name;
        Function function;
        const float* input;
    } functions[] = {{"Func/Log10", &Func::Log10, magnitudes}, {"Func/Pow10", &Func::Pow10, a},
                     {"Func/Exp", &Func::Exp, a},               {"Func/Tanh", &Func::Tanh, a},
                     {"Func/Sqrt", &Func::Sqrt, magnitudes}};
    for (const auto& function : functions)
        families.push_back({function.name, true, false, [=, f = function.function, in = function.input] {
                                auto func = std::make_shared<Func>();
                                return std::function<void()>([=] { ((*func).*f)(in, out, kFrames); });
                            }});
    return families;
}

bool Registered() {
    for (const Family& family : Families()) {
        for (const Level& level : kLevels) {
            // Each family runs the forms it has: its ref, and the vector forms
            // of its ladder (fused ones only where the sums are filters).
            const bool refLevel = level.level == InstructionLevel::None;
            if (family.integer ? (!level.integer && !refLevel) : level.integer) continue;
            if (level.fma && !family.fused) continue;
            if (!Runnable(level)) continue;
            const std::string name = std::string("Kernel/") + family.name + "/" + level.name;
            benchmark::RegisterBenchmark(name.c_str(), [family, level](benchmark::State& state) {
                std::function<void()> step;
                {
                    ScopedDispatch forced(level.level, level.fma);
                    step = family.setup();
                }
                for (auto _ : state) {
                    step();
                    benchmark::ClobberMemory();
                }
                zenbench::ReportRealtime(state, kFrames);
            });
        }
    }
    return true;
}

const bool kRegistered = Registered();

}  // namespace
