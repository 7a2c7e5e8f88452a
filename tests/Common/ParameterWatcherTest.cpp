// Editors following parameter changes made on other threads, and state loads.
#include <gtest/gtest.h>

#include <QCoreApplication>
#include <QElapsedTimer>
#include <QThread>
#include <cmath>
#include <thread>
#include <utility>
#include <vector>

#include "Common/ParameterWatcher.h"
#include "Common/ZenAudioPluginImpl.h"
#include "Support/PluginHarness.h"
#include "Support/TestApplication.h"

using zentest::EnsureApplication;
using zentest::PluginHarness;

namespace {

// What a watcher emitted, and on which thread.
struct Recorder {
    explicit Recorder(zen::ParameterWatcher& watcher) {
        QObject::connect(&watcher, &zen::ParameterWatcher::ParameterChanged, [this](int index, float value) {
            changes.emplace_back(index, value);
            threads.push_back(QThread::currentThread());
        });
        QObject::connect(&watcher, &zen::ParameterWatcher::StateLoaded, [this] { ++loads; });
    }
    std::vector<std::pair<int, float>> changes;
    std::vector<QThread*> threads;
    int loads = 0;
};

const zen::ParameterTable& ParametersOf(PluginHarness& plugin) {
    return dynamic_cast<ZenAudioPluginImpl&>(plugin.Instance()).Parameters();
}

}  // namespace

TEST(ParameterWatcher, ReportsAChangeFromAnotherThreadOnTheEditorsThread) {
    EnsureApplication();
    PluginHarness plugin("Test Delay");
    plugin.Set("Gain", -1.0f);  // before the watcher: not reported
    zen::ParameterWatcher watcher(ParametersOf(plugin));
    Recorder recorder(watcher);
    std::thread([&] { plugin.Audio().SetParameter(1, -3.0f); }).join();

    // The watcher's own timer delivers it; pump events until it does.
    QElapsedTimer patience;
    patience.start();
    while (recorder.changes.empty() && patience.elapsed() < 10000)
        QCoreApplication::processEvents(QEventLoop::AllEvents, 50);
    ASSERT_EQ(recorder.changes.size(), 1u);
    EXPECT_EQ(recorder.changes[0], std::make_pair(1, -3.0f));
    EXPECT_EQ(recorder.threads[0], watcher.thread());
    EXPECT_EQ(recorder.loads, 0);
}

TEST(ParameterWatcher, CoalescesChangesAndEachWatcherKeepsItsOwnCounts) {
    EnsureApplication();
    PluginHarness plugin("Test Delay");
    zen::ParameterWatcher first(ParametersOf(plugin)), second(ParametersOf(plugin));
    Recorder a(first), b(second);
    plugin.Set("Mode", 1.0f);
    plugin.Set("Gain", -6.0f);
    plugin.Set("Gain", 2.0f);
    EXPECT_FALSE(plugin.Audio().SetParameter(1, NAN));  // refused: no change
    first.Poll();
    first.Poll();
    EXPECT_EQ(a.changes, (std::vector<std::pair<int, float>>{{1, 2.0f}, {2, 1.0f}}));
    second.Poll();
    EXPECT_EQ(b.changes, a.changes);
}

TEST(ParameterWatcher, StatesAndPresetsMarkEveryParameter) {
    EnsureApplication();
    PluginHarness plugin("Test Delay");
    zen::ParameterWatcher watcher(ParametersOf(plugin));
    Recorder recorder(watcher);
    ASSERT_TRUE(plugin.Audio().LoadState("{\"parameters\": {\"ZenTestDelay::GAIN\": -4}}"));
    watcher.Poll();
    EXPECT_EQ(recorder.changes, (std::vector<std::pair<int, float>>{{0, 64.0f}, {1, -4.0f}, {2, 0.0f}}));
    EXPECT_EQ(recorder.loads, 1);
    EXPECT_FALSE(plugin.Audio().LoadState("not json"));
    watcher.Poll();
    EXPECT_EQ(recorder.loads, 1);

    PluginHarness clipper("Soft Clipper");
    zen::ParameterWatcher presets(ParametersOf(clipper));
    Recorder loaded(presets);
    ASSERT_TRUE(clipper.Audio().LoadPreset("Warm Drive"));
    presets.Poll();
    EXPECT_EQ(loaded.changes.size(), 3u);
    EXPECT_EQ(loaded.loads, 1);
}
