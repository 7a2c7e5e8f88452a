// Realtime factors of the metering algorithms, 48 kHz, 512-frame blocks of
// full-scale noise.
#include <cstdint>

#include "Common/Algorithms/CorrelationMeter.h"
#include "Common/Algorithms/LoudnessMeter.h"
#include "Common/Algorithms/SpectrumAnalyzer.h"
#include "Support/NoiseSource.h"
#include "Support/Realtime.h"

using zenbench::NoiseSource;

// Arguments: channels, true peak on.
static void BM_LoudnessMeter(benchmark::State& state) {
    const auto channels = static_cast<std::uint32_t>(state.range(0));
    LoudnessMeter meter;
    meter.SetChannelCount(channels);
    meter.Prepare(static_cast<float>(zenbench::kSampleRate), zenbench::kBlock);
    meter.SetTruePeakEnabled(state.range(1) != 0);
    NoiseSource input(channels);
    for (auto _ : state) {
        meter.Process(input.Next(), zenbench::kBlock);
        benchmark::DoNotOptimize(meter.Integrated());
    }
    zenbench::ReportRealtime(state, zenbench::kBlock);
}
BENCHMARK(BM_LoudnessMeter)->ArgNames({"channels", "truePeak"})->Args({2, 1})->Args({6, 1})->Args({2, 0})->Args({6, 0});

static void BM_CorrelationMeter_Stereo(benchmark::State& state) {
    CorrelationMeter meter;
    meter.SetChannelCount(2);
    meter.Prepare(static_cast<float>(zenbench::kSampleRate), zenbench::kBlock);
    NoiseSource input(2);
    for (auto _ : state) {
        meter.Process(input.Next(), zenbench::kBlock);
        benchmark::DoNotOptimize(meter.Current().correlation);
    }
    zenbench::ReportRealtime(state, zenbench::kBlock);
}
BENCHMARK(BM_CorrelationMeter_Stereo);

// Argument: the size's index (0: 1024 ... 5: 32768); stereo, Blackman-Harris.
static void BM_SpectrumAnalyzer_Stereo(benchmark::State& state) {
    SpectrumAnalyzer analyzer;
    analyzer.SetChannelCount(2);
    analyzer.Prepare(static_cast<float>(zenbench::kSampleRate), zenbench::kBlock);
    analyzer.SetParameter(SpectrumAnalyzer::kSize, static_cast<float>(state.range(0)));
    NoiseSource input(2);
    for (auto _ : state) {
        analyzer.Process(input.Next(), zenbench::kBlock);
        benchmark::DoNotOptimize(analyzer.Frames());
    }
    zenbench::ReportRealtime(state, zenbench::kBlock);
}
BENCHMARK(BM_SpectrumAnalyzer_Stereo)->ArgName("size")->Arg(2)->Arg(5);
