// An open editor changes nothing on the audio thread: every plug-in of the
// library, processed on one thread with random parameter changes and bypass
// switches, while its editor is shown and refreshing on this one, makes no
// allocation, free or lock inside Process, as the validator counts them.
#include <gtest/gtest.h>

#include <QApplication>
#include <QEventLoop>
#include <QTimer>
#include <QWidget>
#include <atomic>
#include <memory>
#include <random>
#include <string>
#include <thread>
#include <vector>

#include "PluginLibrary.h"
#include "RealtimeMonitor.h"

namespace {

constexpr std::uint32_t kBlock = 256;
constexpr int kRefreshMilliseconds = 200;  // several refreshes at 30 per second

zenfx::PluginLibrary& Library() {
    static zenfx::PluginLibrary library(ZEN_LIBRARY_PATH);
    return library;
}

std::vector<std::string> AudioPlugins() {
    std::vector<std::string> keys;
    for (const zenfx::PluginEntry& entry : Library().List())
        if (entry.kind == zen::kAudioPluginKind) keys.push_back(entry.key);
    return keys;
}

void EnsureApplication() {
    if (QCoreApplication::instance() != nullptr) return;
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM")) qputenv("QT_QPA_PLATFORM", "offscreen");
    static int argc = 1;
    static char name[] = "ZenHostTests";
    static char* argv[] = {name, nullptr};
    new QApplication(argc, argv);
}

std::string TestName(const testing::TestParamInfo<std::string>& plugin) {
    std::string name = plugin.param.substr(0, plugin.param.find(':'));
    for (char& c : name)
        if (!std::isalnum(static_cast<unsigned char>(c))) c = '_';
    return name;
}

class RealtimeWithEditor : public testing::TestWithParam<std::string> {};

}  // namespace

// The application lives until the process ends, and fontconfig keeps what
// Qt's font database asked of it: not ours to free.
extern "C" const char* __lsan_default_suppressions() { return "leak:libfontconfig.so\n"; }

TEST_P(RealtimeWithEditor, ProcessStaysFreeOfAllocationsAndLocks) {
    ASSERT_TRUE(zenfx::RealtimeWatch::SeesAllocations());
    EnsureApplication();
    zenfx::PluginEntry plugin;
    plugin.kind = zen::kAudioPluginKind;
    plugin.key = GetParam();
    std::unique_ptr<zen::PluginInstance> instance = Library().Create(plugin);
    AudioPlugin& audio = zenfx::AudioOf(*instance);
    ASSERT_TRUE(audio.Prepare(48000.0f, kBlock));
    if (audio.LocksAudioPath()) GTEST_SKIP() << "declares a lock on its audio path";

    std::unique_ptr<QWidget> editor(static_cast<QWidget*>(audio.CreateEditor(nullptr)));
    ASSERT_NE(editor, nullptr);
    editor->show();

    const std::uint32_t channels = std::max(audio.GetInputChannelCount(), audio.GetOutputChannelCount());
    std::vector<std::vector<float>> buffers(channels, std::vector<float>(kBlock));
    std::vector<float*> pointers;
    for (auto& buffer : buffers) pointers.push_back(buffer.data());
    std::vector<zen::ParameterInfo> infos(audio.GetParameterCount());
    for (std::uint32_t i = 0; i < infos.size(); ++i) audio.GetParameterInfo(i, infos[i]);

    std::atomic<bool> stop{false};
    zenfx::RealtimeCounts counts;
    std::uint64_t blocks = 0;
    std::thread worker([&] {
        std::mt19937 random(7);
        std::uniform_real_distribution<float> unit(0.0f, 1.0f);
        std::normal_distribution<float> noise(0.0f, 0.2f);
        while (!stop.load()) {
            // Parameter changes and bypass between blocks, as a host makes them.
            if (!infos.empty()) {
                const auto index = static_cast<std::uint32_t>(random() % infos.size());
                const zen::ParameterInfo& info = infos[index];
                audio.SetParameter(index, info.minimum + unit(random) * (info.maximum - info.minimum));
            }
            if (blocks % 50 == 25) audio.SetBypass(!audio.IsBypassed());
            for (auto& buffer : buffers)
                for (float& sample : buffer) sample = noise(random);
            zenfx::RealtimeWatch watch;
            audio.Process(pointers.data(), kBlock);
            counts += watch.Stop();
            ++blocks;
        }
    });
    QEventLoop loop;
    QTimer::singleShot(kRefreshMilliseconds, &loop, &QEventLoop::quit);
    loop.exec();
    stop.store(true);
    worker.join();
    editor.reset();

    EXPECT_GT(blocks, 0u);
    EXPECT_EQ(counts.allocations, 0u);
    EXPECT_EQ(counts.frees, 0u);
    EXPECT_EQ(counts.locks, 0u);
}

INSTANTIATE_TEST_SUITE_P(Library, RealtimeWithEditor, testing::ValuesIn(AudioPlugins()), TestName);
