#include <vector>

#include "Common/Algorithms/BChainProcessor.h"
#include "HostCore/Devices/NullDevice.h"
#include "HostCore/Tools/TestToneGenerator.h"
#include "Support/Realtime.h"

// Plug-ins at their defaults, as "Performance Testing" runs them, so its
// figures can be held against these.
static void BM_Defaults(benchmark::State& state, const char* name) { zenbench::RunPlugin(state, name, 2); }
BENCHMARK_CAPTURE(BM_Defaults, SoftClipper, "Soft Clipper");
BENCHMARK_CAPTURE(BM_Defaults, Limiter, "Limiter");
BENCHMARK_CAPTURE(BM_Defaults, DeEsser, "De-Esser");

// A 7.1.4 monitor's B-chain with every band on and a delay per speaker.
static void BM_BChainProcessor_12Channels48k(benchmark::State& state) {
    constexpr std::size_t kChannels = 12;
    std::vector<BChainProcessor::Channel> settings(kChannels);
    const zen::host::BChainDocument::Shape shapes[] = {
        zen::host::BChainDocument::kHighPass, zen::host::BChainDocument::kBell, zen::host::BChainDocument::kBell,
        zen::host::BChainDocument::kHighShelf};
    for (std::size_t c = 0; c < kChannels; ++c) {
        settings[c].delayMs = 0.37 * static_cast<double>(c);
        settings[c].gainDb = -1.5;
        for (std::size_t b = 0; b < BChainProcessor::kBands; ++b)
            settings[c].bands[b] = {shapes[b], 60.0 * static_cast<double>((b + 1) * (b + 2)), -3.0, 1.2};
    }
    BChainProcessor chain;
    chain.SetChannelCount(kChannels);
    chain.Prepare(48000.0f, zenbench::kBlock);
    chain.Configure(settings);
    std::vector<std::vector<float>> work(kChannels, std::vector<float>(zenbench::kBlock, 0.25f));
    std::vector<float*> pointers;
    for (auto& channel : work) pointers.push_back(channel.data());
    for (auto _ : state) {
        chain.Process(pointers.data(), zenbench::kBlock);
        benchmark::ClobberMemory();
    }
    zenbench::ReportRealtime(state, zenbench::kBlock);
}
BENCHMARK(BM_BChainProcessor_12Channels48k);

// Test tones, stereo, generated block by block on the null device.
static void BM_TestTone(benchmark::State& state, zen::host::OscillatorDocument::Signal signal) {
    zen::host::OscillatorDocument::Tone tone;
    tone.signal = signal;
    tone.duration = zen::host::OscillatorDocument::kMaximumDuration;  // never runs out while timed
    zen::host::TestToneGenerator generator(tone);
    zen::host::NullDevice device({48000, zenbench::kBlock, 0, 2});
    for (auto _ : state) {
        device.Run(generator, zenbench::kBlock);
        benchmark::ClobberMemory();
    }
    zenbench::ReportRealtime(state, zenbench::kBlock);
}
BENCHMARK_CAPTURE(BM_TestTone, Sine, zen::host::OscillatorDocument::kSine);
BENCHMARK_CAPTURE(BM_TestTone, Pink, zen::host::OscillatorDocument::kPink);
