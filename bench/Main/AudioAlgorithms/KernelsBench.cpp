// Every kernel family in every form this processor runs, forced one by one:
// "realtime" is seconds of 48 kHz audio (one channel, or one matrix-vector
// product per frame for Gemv) per second of CPU, so the forms of a family
// compare directly with its ref.
#include <benchmark/benchmark.h>

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "Algorithms/Blas1.h"
#include "Algorithms/Blas2.h"
#include "Algorithms/CastFloatInt32.h"
#include "Algorithms/Deinterleave.h"
#include "Algorithms/FIR.h"
#include "Algorithms/FIRS.h"
#include "Algorithms/FindMinMax.h"
#include "Algorithms/Interleave.h"
#include "Algorithms/LR2MS.h"
#include "Algorithms/MS2LR.h"
#include "Algorithms/Mix.h"
#include "Algorithms/TruePeak.h"
#include "Algorithms/UpsamplerTruePeak_x4.h"
#include "Algorithms/Vec.h"
#include "Algorithms/random/LCG.h"
#include "Support/Realtime.h"
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

std::vector<Family> Families() {
    auto a = std::make_shared<std::vector<float>>(Noise(4 * kFrames, 1));
    auto b = std::make_shared<std::vector<float>>(Noise(4 * kFrames, 2));
    auto out = std::make_shared<std::vector<float>>(8 * kFrames);
    auto out2 = std::make_shared<std::vector<float>>(8 * kFrames);
    std::vector<Family> families;
    families.push_back({"FIR/64 taps", true, false, [=] {
                            auto f = std::make_shared<FIR>(FIRConfig{1, Noise(64, 3)});
                            return std::function<void()>([=] { f->Process(a->data(), out->data(), kFrames); });
                        }});
    families.push_back({"FIR/64 taps, 2 ch", true, false, [=] {
                            auto f = std::make_shared<FIR>(FIRConfig{2, Noise(64, 3)});
                            return std::function<void()>([=] {
                                const float* in[2] = {a->data(), b->data()};
                                float* o[2] = {out->data(), out2->data()};
                                f->Process(in, o, kFrames);
                            });
                        }});
    families.push_back({"FIRS/65 taps", true, false, [=] {
                            auto f = std::make_shared<FIRS>(FIRSConfig{1, Noise(33, 4), 65});
                            return std::function<void()>([=] { f->Process(a->data(), out->data(), kFrames); });
                        }});
    for (TruePeakFilter filter : {TruePeakFilter::Standard, TruePeakFilter::Wideband}) {
        const bool wide = filter == TruePeakFilter::Wideband;
        families.push_back({wide ? "UpsamplerTruePeak_x4/wideband" : "UpsamplerTruePeak_x4/standard", true, false, [=] {
                                auto f = std::make_shared<UpsamplerTruePeak_x4>(UpsamplerTruePeakConfig{1, filter});
                                return std::function<void()>([=] { f->Process(a->data(), out->data(), kFrames); });
                            }});
        families.push_back({wide ? "TruePeak/wideband" : "TruePeak/standard", true, false, [=] {
                                auto f = std::make_shared<TruePeak>(TruePeakConfig{1, 1.0f, filter});
                                return std::function<void()>(
                                    [=] { benchmark::DoNotOptimize(f->Process(a->data(), kFrames)); });
                            }});
    }
    families.push_back({"FindMinMax/1 ch", false, false, [=] {
                            auto f = std::make_shared<FindMinMax>();
                            return std::function<void()>([=] { f->Process(a->data(), kFrames); });
                        }});
    families.push_back({"FindMinMax/2 ch interleaved", false, false, [=] {
                            auto f = std::make_shared<FindMinMax>(FindMinMaxConfig{2});
                            return std::function<void()>([=] { f->Process(a->data(), kFrames); });
                        }});
    families.push_back({"LR2MS", false, false, [=] {
                            auto f = std::make_shared<LR2MS>();
                            return std::function<void()>(
                                [=] { f->Process(a->data(), b->data(), out->data(), out2->data(), kFrames); });
                        }});
    families.push_back({"MS2LR", false, false, [=] {
                            auto f = std::make_shared<MS2LR>();
                            return std::function<void()>(
                                [=] { f->Process(a->data(), b->data(), out->data(), out2->data(), kFrames); });
                        }});
    families.push_back(
        {"Mix/4 sources", false, false, [=] {
             auto f = std::make_shared<Mix>(MixConfig{{0.5f, -0.25f, 0.125f, 0.7f}});
             return std::function<void()>([=] {
                 const float* sources[4] = {a->data(), b->data(), a->data() + kFrames, b->data() + kFrames};
                 f->Process(sources, out->data(), kFrames);
             });
         }});
    families.push_back({"Vec/Multiply", false, false, [=] {
                            auto f = std::make_shared<Vec>();
                            return std::function<void()>(
                                [=] { f->Multiply(a->data(), b->data(), out->data(), kFrames); });
                        }});
    families.push_back({"Vec/Clamp", false, false, [=] {
                            auto f = std::make_shared<Vec>();
                            return std::function<void()>(
                                [=] { f->Clamp(a->data(), -0.5f, 0.5f, out->data(), kFrames); });
                        }});
    families.push_back({"Vec/Sanitize", false, false, [=] {
                            auto f = std::make_shared<Vec>();
                            return std::function<void()>(
                                [=] { f->Sanitize(a->data(), 0.5f, out->data(), kFrames); });
                        }});
    families.push_back({"Blas1/Dot", false, false, [=] {
                            auto f = std::make_shared<Blas1>();
                            return std::function<void()>(
                                [=] { benchmark::DoNotOptimize(f->Dot(a->data(), b->data(), kFrames)); });
                        }});
    families.push_back({"Blas2/Gemv 16x16", false, false, [=] {
                            auto f = std::make_shared<Blas2>();
                            auto matrix = std::make_shared<std::vector<float>>(Noise(256, 5));
                            return std::function<void()>([=] {
                                // One product per frame, as a 16-line mixing matrix runs.
                                for (std::size_t n = 0; n + 16 <= kFrames; n += 16)
                                    f->Gemv(matrix->data(), 16, 16, 16, a->data() + n, out->data() + n);
                            });
                        }});
    families.push_back({"Interleave/2 ch", false, false, [=] {
                            auto f = std::make_shared<Interleave>(InterleaveConfig{2});
                            return std::function<void()>([=] {
                                const float* in[2] = {a->data(), b->data()};
                                f->Process(in, out->data(), kFrames);
                            });
                        }});
    families.push_back({"Deinterleave/2 ch", false, false, [=] {
                            auto f = std::make_shared<Deinterleave>(DeinterleaveConfig{2});
                            return std::function<void()>([=] {
                                float* o[2] = {out->data(), out2->data()};
                                f->Process(a->data(), o, kFrames);
                            });
                        }});
    families.push_back({"CastFloatInt32/ToInt32", false, false, [=] {
                            auto f = std::make_shared<CastFloatInt32>();
                            auto ints = std::make_shared<std::vector<std::int32_t>>(kFrames);
                            return std::function<void()>(
                                [=] { f->ToInt32(a->data(), ints->data(), kFrames, CastFloatInt32::kPcm32Scale); });
                        }});
    families.push_back({"random::LCG", false, true, [=] {
                            auto f = std::make_shared<random::LCG>();
                            return std::function<void()>([=] { f->Generate(out->data(), kFrames); });
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
