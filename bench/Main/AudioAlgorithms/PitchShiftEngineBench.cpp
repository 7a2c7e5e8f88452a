// Realtime factor of the pitch shifter per channel at 48 kHz (one channel,
// 512-frame blocks, a fourth up), for each phase reconstruction on each FFT
// back end; and the 4096-point real transforms alone.
#include <random>
#include <vector>

#include "FFT/FFT.h"
#include "Retimer/PitchShiftEngine.h"
#include "Support/Realtime.h"

namespace {

using ora::fft::Backend;

void ShiftOneChannel(benchmark::State& state, Backend backend, int algorithm) {
    if (!ora::fft::FFT::IsAvailable(backend)) {
        state.SkipWithError("back end not built");
        return;
    }
    ora::pitchshift::EngineParam param(4096, 4, 4096, 2);
    ora::pitchshift::Engine engine(param);
    if (!engine.Configure(1, backend)) {
        state.SkipWithError("engine refused");
        return;
    }
    ora::pitchshift::Engine::Settings settings;
    settings.coarse = 5;
    settings.algorithmType = algorithm;
    engine.Apply(settings, engine.Changes(settings));
    std::vector<float> in(zenbench::kBlock), out(zenbench::kBlock);
    std::mt19937 rng(1);
    std::uniform_real_distribution<float> noise(-0.5f, 0.5f);
    for (float& x : in) x = noise(rng);
    const float* ip[1] = {in.data()};
    float* op[1] = {out.data()};
    for (auto _ : state) {
        engine.Process(ip, op, zenbench::kBlock);
        benchmark::DoNotOptimize(out.data());
    }
    zenbench::ReportRealtime(state, zenbench::kBlock);
}

void RealTransforms(benchmark::State& state, Backend backend) {
    if (!ora::fft::FFT::IsAvailable(backend)) {
        state.SkipWithError("back end not built");
        return;
    }
    ora::fft::FFT fft(4096, backend);
    std::vector<float> x(4096, 0.25f);
    std::vector<ora::fft::Complex> bins(fft.Bins());
    for (auto _ : state) {
        fft.ForwardReal(x.data(), bins.data());
        fft.InverseReal(bins.data(), x.data());
        benchmark::DoNotOptimize(x.data());
    }
    // One forward and one inverse transform per synthesis hop of 1024.
    zenbench::ReportRealtime(state, 1024);
}

}  // namespace

BENCHMARK_CAPTURE(ShiftOneChannel, PGHI_kiss, Backend::Kiss, 1);
BENCHMARK_CAPTURE(ShiftOneChannel, PGHI_fftw, Backend::Fftw, 1);
BENCHMARK_CAPTURE(ShiftOneChannel, PLPV_kiss, Backend::Kiss, 0);
BENCHMARK_CAPTURE(ShiftOneChannel, PLPV_fftw, Backend::Fftw, 0);
BENCHMARK_CAPTURE(RealTransforms, kiss, Backend::Kiss);
BENCHMARK_CAPTURE(RealTransforms, fftw, Backend::Fftw);
