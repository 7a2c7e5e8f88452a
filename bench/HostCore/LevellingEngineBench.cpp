#include <benchmark/benchmark.h>

#include <algorithm>
#include <random>
#include <vector>

#include "HostCore/Levelling/LevellingEngine.h"
#include "Support/Realtime.h"

// The engine as the "AI" plug-in feeds it: after every new block of ten
// entries, the last 40 again. One hour of phrases and pauses; realtime is
// audio seconds per CPU second.
static void BM_LevellingEngine_HourOfDialogue(benchmark::State& state, bool clips) {
    constexpr std::int64_t kEntries = 9000, kReadBehind = 40;
    std::mt19937 random(3);
    std::uniform_real_distribution<float> level(-40.0f, -12.0f);
    std::vector<float> inputs(kEntries);
    for (float& v : inputs) v = random() % 4 == 0 ? zen::levelling::kNoSpeech : level(random);
    for (auto _ : state) {
        zen::host::LevellingEngine engine;
        engine.Settings().SetMode(1);
        engine.Settings().SetNormaliseClips(clips, zen::levelling::kNoValue, 6.0f);
        for (std::int64_t whole = 10; whole <= kEntries; whole += 10)
            for (std::int64_t first = std::max<std::int64_t>(0, whole - kReadBehind); first < whole; first += 10) {
                zen::host::LevellingEngine::Inputs block;
                std::copy_n(inputs.begin() + first, block.size(), block.begin());
                benchmark::DoNotOptimize(engine.Process(first, block));
            }
        benchmark::DoNotOptimize(engine.Finish(kEntries));
    }
    zenbench::ReportRealtime(state, static_cast<double>(kEntries * zen::levelling::kEntryFrames), 48000.0);
}
BENCHMARK_CAPTURE(BM_LevellingEngine_HourOfDialogue, Riding, false)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_LevellingEngine_HourOfDialogue, Clips, true)->Unit(benchmark::kMillisecond);
