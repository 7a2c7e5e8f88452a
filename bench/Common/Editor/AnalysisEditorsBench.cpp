// What an open analysis editor costs the UI thread: one refresh (the
// displays read their meters and rings) and one paint of the whole editor,
// after a refresh period's worth of audio. "ui_share" is the part of one
// core the editor takes at its display rate.
#include <benchmark/benchmark.h>

#include <QApplication>
#include <QImage>
#include <QPainter>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include "Common/Editor/ZenEditor.h"
#include "Support/Realtime.h"
#include "zen/Zen.h"

namespace {

QApplication& Application() {
    static int argc = 1;
    static char name[] = "ZenBenchmarks";
    static char* argv[] = {name, nullptr};
    static std::unique_ptr<QApplication> application = [] {
        qputenv("QT_QPA_PLATFORM", "offscreen");
        return std::make_unique<QApplication>(argc, argv);
    }();
    return *application;
}

void RunEditor(benchmark::State& state, const std::string& name, std::uint32_t channels) {
    Application();
    zen::PluginInterface* library = GetZenPluginInterface();
    std::unique_ptr<zen::PluginInstance> instance;
    for (const auto& entry : library->GetPluginList(zen::kAudioPluginKind))
        if (entry.second.name == name) instance.reset(library->CreatePlugin(zen::kAudioPluginKind, entry.first));
    auto* plugin = instance ? zen::InterfaceCast<AudioPlugin>(instance.get()) : nullptr;
    if (plugin == nullptr || !plugin->ConfigureChannels(channels, channels) ||
        !plugin->Prepare(static_cast<float>(zenbench::kSampleRate), zenbench::kBlock)) {
        state.SkipWithError("cannot prepare the plug-in");
        return;
    }
    std::unique_ptr<QWidget> widget(static_cast<QWidget*>(plugin->CreateEditor(nullptr)));
    auto* editor = qobject_cast<ZenEditor*>(widget.get());
    widget->resize(1000, 720);
    QImage canvas(widget->size(), QImage::Format_ARGB32_Premultiplied);

    // A refresh period of noise, processed outside the timing.
    const auto framesPerRefresh = static_cast<std::uint32_t>(zenbench::kSampleRate / ZenEditor::kDisplayRate);
    std::vector<std::vector<float>> audio(channels, std::vector<float>(zenbench::kBlock));
    std::vector<float*> pointers(channels);
    std::minstd_rand random(1);
    std::uniform_real_distribution<float> noise(-0.5f, 0.5f);
    for (auto _ : state) {
        state.PauseTiming();
        for (std::uint32_t done = 0; done < framesPerRefresh; done += zenbench::kBlock) {
            for (std::uint32_t c = 0; c < channels; ++c) {
                for (float& x : audio[c]) x = noise(random);
                pointers[c] = audio[c].data();
            }
            plugin->Process(pointers.data(), zenbench::kBlock);
        }
        state.ResumeTiming();
        editor->RefreshNow();
        QPainter painter(&canvas);
        widget->render(&painter);
    }
    state.counters["ui_share"] =
        benchmark::Counter(static_cast<double>(state.iterations()) / ZenEditor::kDisplayRate,
                           benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

}  // namespace

static void BM_Editor_PhaseMeter(benchmark::State& state) { RunEditor(state, "Phase Meter", 2); }
BENCHMARK(BM_Editor_PhaseMeter)->Unit(benchmark::kMillisecond);
static void BM_Editor_FrequencyAnalyzer(benchmark::State& state) { RunEditor(state, "Frequency Analyzer", 2); }
BENCHMARK(BM_Editor_FrequencyAnalyzer)->Unit(benchmark::kMillisecond);
static void BM_Editor_Meter(benchmark::State& state) { RunEditor(state, "Meter", 2); }
BENCHMARK(BM_Editor_Meter)->Unit(benchmark::kMillisecond);
static void BM_Editor_Reverb(benchmark::State& state) { RunEditor(state, "Reverb", 2); }
BENCHMARK(BM_Editor_Reverb)->Unit(benchmark::kMillisecond);
static void BM_Editor_NoiseReduction(benchmark::State& state) { RunEditor(state, "Noise Reduction", 2); }
BENCHMARK(BM_Editor_NoiseReduction)->Unit(benchmark::kMillisecond);
