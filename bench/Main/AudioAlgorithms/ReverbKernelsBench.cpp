// The reverb's kernel families in every form this processor runs, as
// realtime factors of one 48 kHz stream (frames per call over 48000).
#include <memory>
#include <vector>

#include "Algorithms/Downsampler.h"
#include "Algorithms/Lpf16.h"
#include "Algorithms/Lpfm16.h"
#include "Algorithms/U15p.h"
#include "Algorithms/Upsampler.h"
#include "Support/Realtime.h"
#include "System/DispatchSettings.h"

using namespace ora::numeric;
using ora::system::InstructionLevel;

namespace {

struct FormChoice {
    InstructionLevel level;
    bool fma;
};
const FormChoice kForms[] = {{InstructionLevel::None, false},
                             {InstructionLevel::SSE2, false},
                             {InstructionLevel::SSE42, true},
                             {InstructionLevel::AVX, false},
                             {InstructionLevel::AVX, true}};

// Forces the form of argument 0 for the scope; false when this processor cannot run it.
bool Force(benchmark::State& state, std::unique_ptr<ora::system::ScopedDispatch>& scope) {
    const FormChoice& f = kForms[state.range(0)];
    const auto& cpu = ora::system::DispatchSettings::Instance().Detected();
    if ((f.level >= InstructionLevel::AVX && !cpu.osAvx) || (f.fma && !(cpu.fma && cpu.osAvx))) {
        state.SkipWithError("form not available here");
        return false;
    }
    scope = std::make_unique<ora::system::ScopedDispatch>(f.level, f.fma);
    return true;
}

std::vector<float> Frames(std::size_t n) {
    std::vector<float> v(n);
    for (std::size_t i = 0; i < n; ++i) v[i] = static_cast<float>((i * 7919) % 1000) / 1000.0f - 0.5f;
    return v;
}

}  // namespace

static void BM_U15p(benchmark::State& state) {
    std::unique_ptr<ora::system::ScopedDispatch> scope;
    if (!Force(state, scope)) return;
    U15p kernel;
    state.SetLabel(kernel.FormName());
    const std::size_t frames = 512;
    auto d = Frames(frames * 16), u = Frames(frames * 16), m = Frames(frames * 16);
    for (auto _ : state) {
        kernel.Process(d.data(), u.data(), m.data(), frames);
        benchmark::ClobberMemory();
    }
    zenbench::ReportRealtime(state, frames);
}
BENCHMARK(BM_U15p)->DenseRange(0, 4);

static void BM_Lpf16(benchmark::State& state) {
    std::unique_ptr<ora::system::ScopedDispatch> scope;
    if (!Force(state, scope)) return;
    Lpf16 kernel;
    state.SetLabel(kernel.FormName());
    float c[16], g[16];
    for (int i = 0; i < 16; ++i) {
        c[i] = -0.3f;
        g[i] = 0.9f;
    }
    kernel.SetCoefficients(c, g);
    const std::size_t frames = 512;
    auto in = Frames(frames * 16), out = Frames(frames * 16);
    for (auto _ : state) {
        kernel.Process(in.data(), out.data(), frames);
        benchmark::ClobberMemory();
    }
    zenbench::ReportRealtime(state, frames);
}
BENCHMARK(BM_Lpf16)->DenseRange(0, 4);

static void BM_Lpfm16(benchmark::State& state) {
    std::unique_ptr<ora::system::ScopedDispatch> scope;
    if (!Force(state, scope)) return;
    Lpfm16 kernel;
    state.SetLabel(kernel.FormName());
    float c[16];
    for (float& v : c) v = -0.3f;
    kernel.SetCoefficients(c);
    const std::size_t frames = 512;
    auto in = Frames(frames * 16), out = Frames(frames * 16);
    for (auto _ : state) {
        kernel.Process(in.data(), out.data(), frames);
        benchmark::ClobberMemory();
    }
    zenbench::ReportRealtime(state, frames);
}
BENCHMARK(BM_Lpfm16)->DenseRange(0, 4);

// Realtime of the low-rate stream: 1024 frames in, 1024 x factor out.
static void BM_Upsampler(benchmark::State& state) {
    std::unique_ptr<ora::system::ScopedDispatch> scope;
    if (!Force(state, scope)) return;
    const auto factor = static_cast<std::size_t>(state.range(1));
    Upsampler kernel({factor, 32, {}, 1, 1024});
    state.SetLabel(std::string(kernel.FormName()) + " x" + std::to_string(factor));
    auto in = Frames(1024), out = Frames(1024 * factor);
    for (auto _ : state) {
        kernel.Process(in.data(), out.data(), 1024);
        benchmark::ClobberMemory();
    }
    zenbench::ReportRealtime(state, 1024);
}
BENCHMARK(BM_Upsampler)->ArgsProduct({{0, 1, 2, 3, 4}, {2, 4, 8}});

// Realtime of the low-rate stream: 1024 x factor frames in, 1024 out.
static void BM_Downsampler(benchmark::State& state) {
    std::unique_ptr<ora::system::ScopedDispatch> scope;
    if (!Force(state, scope)) return;
    const auto factor = static_cast<std::size_t>(state.range(1));
    Downsampler kernel({factor, 32, {}, 1, 1024 * factor});
    state.SetLabel(std::string(kernel.FormName()) + " /" + std::to_string(factor));
    auto in = Frames(1024 * factor), out = Frames(1024);
    for (auto _ : state) {
        kernel.Process(in.data(), out.data(), 1024 * factor);
        benchmark::ClobberMemory();
    }
    zenbench::ReportRealtime(state, 1024);
}
BENCHMARK(BM_Downsampler)->ArgsProduct({{0, 1, 2, 3, 4}, {2, 4}});
