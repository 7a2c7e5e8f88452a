// Realtime factor of the pitch shifter at 48 kHz (512-frame blocks, a
// fourth up, joint), mono and stereo, for each phase reconstruction on each
// FFT back end; and the 4096-point real transforms alone. The input walks a
// second of fresh noise: a repeated block would be periodic, with far fewer
// significant bins for the reconstructions to integrate.
#include <random>
#include <vector>

#include "FFT/FFT.h"
#include "Retimer/PitchShiftEngine.h"
#include "Support/Realtime.h"

namespace {

using ora::fft::Backend;

void Shift(benchmark::State& state, Backend backend, int algorithm, std::size_t channels) {
    if (!ora::fft::FFT::IsAvailable(backend)) {
        state.SkipWithError("back end not built");
        return;
    }
    ora::pitchshift::EngineParam param(4096, 4, 4096, 2);
    ora::pitchshift::Engine engine(param);
    if (!engine.Configure(channels, backend)) {
        state.SkipWithError("engine refused");
        return;
    }
    ora::pitchshift::Engine::Settings settings;
    settings.coarse = 5;
    settings.algorithmType = algorithm;
    engine.Apply(settings, engine.Changes(settings));

    const std::size_t frames = 48000;
    std::vector<std::vector<float>> source(channels, std::vector<float>(frames));
    std::mt19937 rng(1);
    std::uniform_real_distribution<float> noise(-0.5f, 0.5f);
    for (auto& channel : source)
        for (float& x : channel) x = noise(rng);
    std::vector<std::vector<float>> out(channels, std::vector<float>(zenbench::kBlock));
    std::vector<const float*> ip(channels);
    std::vector<float*> op(channels);
    for (std::size_t c = 0; c < channels; ++c) op[c] = out[c].data();
    std::size_t position = 0;
    for (auto _ : state) {
        for (std::size_t c = 0; c < channels; ++c) ip[c] = source[c].data() + position;
        position = (position + zenbench::kBlock) % (frames - zenbench::kBlock);
        engine.Process(ip.data(), op.data(), zenbench::kBlock);
        benchmark::ClobberMemory();
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

BENCHMARK_CAPTURE(Shift, PGHI_mono_kiss, Backend::Kiss, 1, 1);
BENCHMARK_CAPTURE(Shift, PGHI_mono_fftw, Backend::Fftw, 1, 1);
BENCHMARK_CAPTURE(Shift, PGHI_stereo_kiss, Backend::Kiss, 1, 2);
BENCHMARK_CAPTURE(Shift, PGHI_stereo_fftw, Backend::Fftw, 1, 2);
BENCHMARK_CAPTURE(Shift, PLPV_mono_kiss, Backend::Kiss, 0, 1);
BENCHMARK_CAPTURE(Shift, PLPV_mono_fftw, Backend::Fftw, 0, 1);
BENCHMARK_CAPTURE(Shift, PLPV_stereo_kiss, Backend::Kiss, 0, 2);
BENCHMARK_CAPTURE(Shift, PLPV_stereo_fftw, Backend::Fftw, 0, 2);
BENCHMARK_CAPTURE(RealTransforms, kiss, Backend::Kiss);
BENCHMARK_CAPTURE(RealTransforms, fftw, Backend::Fftw);
