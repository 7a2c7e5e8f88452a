// The reverb's kernel families in every form this processor runs, as
// realtime factors of one 48 kHz stream (frames per call over 48000).
#include <memory>
#include <vector>

#include "Algorithms/BiquadPair.h"
#include "Algorithms/Downsampler.h"
#include "Algorithms/LaneTranspose.h"
#include "Algorithms/Lpf16.h"
#include "Algorithms/Lpfm16.h"
#include "Algorithms/ModulatedTap.h"
#include "Algorithms/Rotor16.h"
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

// The reflections' kernels: 16 phasors, one modulated tap, and the lane transposition.
static void BM_Rotor16(benchmark::State& state) {
    std::unique_ptr<ora::system::ScopedDispatch> scope;
    if (!Force(state, scope)) return;
    Rotor16 kernel;
    state.SetLabel(kernel.FormName());
    Rotor16State st;
    for (int k = 0; k < 16; ++k) {
        st.c[k] = 1.0f;
        st.rc[k] = 0.9999f;
        st.rs[k] = 0.0141f;
    }
    auto out = Frames(512 * 16);
    for (auto _ : state) {
        kernel.Process(st, out.data(), 512);
        benchmark::ClobberMemory();
    }
    zenbench::ReportRealtime(state, 512);
}
BENCHMARK(BM_Rotor16)->DenseRange(0, 4);

static void BM_ModulatedTap(benchmark::State& state) {
    std::unique_ptr<ora::system::ScopedDispatch> scope;
    if (!Force(state, scope)) return;
    ModulatedTap kernel;
    state.SetLabel(kernel.FormName());
    auto line = Frames(4096), s = Frames(512), out = Frames(512);
    for (auto _ : state) {
        kernel.Read(line.data() + 2048, s.data(), 900.0f, 0.5f, 0.8f, out.data(), 512, false);
        benchmark::ClobberMemory();
    }
    zenbench::ReportRealtime(state, 512);
}
BENCHMARK(BM_ModulatedTap)->DenseRange(0, 4);

static void BM_LaneTranspose(benchmark::State& state) {
    std::unique_ptr<ora::system::ScopedDispatch> scope;
    if (!Force(state, scope)) return;
    LaneTranspose kernel;
    state.SetLabel(kernel.FormName());
    auto rows = Frames(512 * 16), frames = Frames(512 * 16);
    float* r[16];
    for (int k = 0; k < 16; ++k) r[k] = rows.data() + 512 * k;
    for (auto _ : state) {
        kernel.ToFrames(r, frames.data(), 512);
        kernel.FromFrames(frames.data(), r, 512);
        benchmark::ClobberMemory();
    }
    zenbench::ReportRealtime(state, 512);
}
BENCHMARK(BM_LaneTranspose)->DenseRange(0, 4);

// Both bands of a stereo tone control.
static void BM_BiquadPair(benchmark::State& state) {
    std::unique_ptr<ora::system::ScopedDispatch> scope;
    if (!Force(state, scope)) return;
    BiquadPair kernel;
    state.SetLabel(kernel.FormName());
    BiquadPairState st;
    const BiquadSection sections[2] = {{-0.6, 1.5, 0.5, -0.3, 0.2}, {-0.3, 0.2, 1.0, 2.0, 0.7}};
    auto left = Frames(512), right = Frames(512);
    float* lanes[] = {left.data(), right.data()};
    for (auto _ : state) {
        kernel.Process(sections, st, lanes, 2, 512);
        benchmark::ClobberMemory();
    }
    zenbench::ReportRealtime(state, 512);
}
BENCHMARK(BM_BiquadPair)->DenseRange(0, 4);
