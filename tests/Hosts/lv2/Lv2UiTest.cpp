// The bundle's Qt 5 UIs as hosts meet them: described for every plug-in with
// the port notifications its meters need, offered by zen_ui.so under the
// same URIs, refused without a QApplication (the UI never makes one), and
// shown by Debian's jalv.qt5 under Xvfb where those are installed.
#include <dlfcn.h>
#include <fcntl.h>
#include <lilv/lilv.h>
#include <lv2/ui/ui.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <set>
#include <thread>

#include <gtest/gtest.h>

#include "../zenfx/ZenfxRunner.h"
#include "Catalog.h"
#include "LilvHost.h"

namespace {

std::string Parent(const std::string& folder) { return folder.substr(0, folder.find_last_of('/')); }

std::string Text(const LilvNode* node) { return node ? lilv_node_as_string(node) : ""; }

bool Installed(const char* program) {
    for (const char* folder : {"/usr/bin/", "/usr/local/bin/"})
        if (access((std::string(folder) + program).c_str(), X_OK) == 0) return true;
    return false;
}

// A program in a process group of its own, output to a file; the group is
// ended at the end of the test whatever happened.
class Background {
public:
    Background(const std::vector<std::string>& command, const std::vector<std::string>& environment) {
        char path[] = "/tmp/zen-ui-test-XXXXXX";
        close(mkstemp(path));
        m_output = path;
        std::vector<std::string> argv = command;
        std::vector<char*> pointers;
        for (std::string& a : argv) pointers.push_back(a.data());
        pointers.push_back(nullptr);
        m_pid = fork();
        if (m_pid != 0) return;
        setpgid(0, 0);
        for (const std::string& variable : environment) putenv(const_cast<char*>(variable.c_str()));
        const int null = open("/dev/null", O_RDONLY);
        const int out = open(path, O_WRONLY | O_TRUNC);
        dup2(null, 0);
        dup2(out, 1);
        dup2(out, 2);
        execvp(pointers[0], pointers.data());
        _exit(127);
    }
    ~Background() { Stop(); unlink(m_output.c_str()); }

    // Still running after `seconds`?
    bool Lives(double seconds) {
        const auto end = std::chrono::steady_clock::now() + std::chrono::duration<double>(seconds);
        while (std::chrono::steady_clock::now() < end) {
            if (Reaped()) return false;
            std::this_thread::sleep_for(std::chrono::milliseconds(50));
        }
        return !Reaped();
    }
    void Stop() {
        if (m_pid <= 0 || m_reaped) return;
        kill(-m_pid, SIGTERM);
        for (int i = 0; i < 100 && !Reaped(); ++i) std::this_thread::sleep_for(std::chrono::milliseconds(50));
        if (!m_reaped) {
            kill(-m_pid, SIGKILL);
            waitpid(m_pid, nullptr, 0);
            m_reaped = true;
        }
    }
    std::string Output() const {
        std::ifstream in(m_output);
        return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
    }

private:
    bool Reaped() {
        if (!m_reaped && waitpid(m_pid, nullptr, WNOHANG) == m_pid) m_reaped = true;
        return m_reaped;
    }
    pid_t m_pid = -1;
    bool m_reaped = false;
    std::string m_output;
};

}  // namespace

TEST(Lv2Ui, EveryPluginNamesItsQt5UiWhichTheUiBinaryOffersAndRefusesWithoutAnApplication) {
    zentest::LilvHost host(ZEN_LV2_BUNDLE);
    LilvWorld* world = host.World();
    LilvNode* qt5 = lilv_new_uri(world, LV2_UI__Qt5UI);
    LilvNode* notification = lilv_new_uri(world, LV2_UI__portNotification);
    LilvNode* symbol = lilv_new_uri(world, LV2_CORE__symbol);
    LilvNode* pluginProperty = lilv_new_uri(world, LV2_UI__plugin);
    std::set<std::string> described;
    for (const std::string& uri : host.PluginUris()) {
        SCOPED_TRACE(uri);
        const LilvPlugin* plugin = host.Find(uri);
        LilvUIs* uis = lilv_plugin_get_uis(plugin);
        ASSERT_EQ(lilv_uis_size(uis), 1u);
        const LilvUI* ui = lilv_uis_get(uis, lilv_uis_begin(uis));
        EXPECT_TRUE(lilv_ui_is_a(ui, qt5));
        char* binary = lilv_file_uri_parse(Text(lilv_ui_get_binary_uri(ui)).c_str(), nullptr);
        EXPECT_EQ(std::filesystem::path(binary), std::filesystem::path(ZEN_LV2_BUNDLE) / "zen_ui.so");
        lilv_free(binary);
        described.insert(Text(lilv_ui_get_uri(ui)));

        // Every control output (meters, latency) and "enabled" is sent to the UI.
        std::set<std::string> wanted = {"enabled"}, notified;
        for (const zentest::Lv2Port& port : host.Ports(plugin))
            if (!port.audio && !port.input) wanted.insert(port.symbol);
        LilvNodes* nodes = lilv_world_find_nodes(world, lilv_ui_get_uri(ui), notification, nullptr);
        LILV_FOREACH (nodes, i, nodes) {
            const LilvNode* node = lilv_nodes_get(nodes, i);
            LilvNode* forPlugin = lilv_world_get(world, node, pluginProperty, nullptr);
            LilvNode* name = lilv_world_get(world, node, symbol, nullptr);
            EXPECT_EQ(Text(forPlugin), uri);
            notified.insert(Text(name));
            lilv_node_free(forPlugin);
            lilv_node_free(name);
        }
        lilv_nodes_free(nodes);
        EXPECT_EQ(notified, wanted);
        lilv_uis_free(uis);
    }
    for (LilvNode* node : {qt5, notification, symbol, pluginProperty}) lilv_node_free(node);
    ASSERT_GE(described.size(), 20u);

    // The binary offers exactly the described UIs, and none in a host
    // without a QApplication (this test program has none).
    void* module = dlopen((std::string(ZEN_LV2_BUNDLE) + "/zen_ui.so").c_str(), RTLD_NOW | RTLD_LOCAL);
    ASSERT_NE(module, nullptr) << dlerror();
    auto entry = reinterpret_cast<LV2UI_DescriptorFunction>(dlsym(module, "lv2ui_descriptor"));
    ASSERT_NE(entry, nullptr);
    std::set<std::string> offered;
    const LV2UI_Descriptor* first = entry(0);
    for (std::uint32_t i = 0; const LV2UI_Descriptor* d = entry(i); ++i) offered.insert(d->URI);
    EXPECT_EQ(offered, described);
    ASSERT_NE(first, nullptr);
    LV2UI_Widget widget = nullptr;
    const std::string pluginUri = first->URI;
    EXPECT_EQ(first->instantiate(first, pluginUri.substr(0, pluginUri.size() - 3).c_str(), ZEN_LV2_BUNDLE, nullptr,
                                 nullptr, &widget, nullptr),
              nullptr);
    EXPECT_EQ(widget, nullptr);
}

// jalv.qt5 on a virtual display and a dummy JACK server of this test's own,
// with only our bundle on LV2_PATH.
TEST(Lv2Ui, JalvQt5ShowsTheUiOfRepresentativePlugins) {
    for (const char* program : {"xvfb-run", "jalv.qt5", "jackd", "jack_wait"})
        if (!Installed(program)) GTEST_SKIP() << program << " is not installed (scripts/install-deps.sh)";
    const std::string server = "zen-ui-test-" + std::to_string(getpid());
    Background jack({"jackd", "--no-realtime", "-n", server, "-d", "dummy", "-r", "48000", "-p", "1024"}, {});
    ASSERT_EQ(zentest::RunProgram("jack_wait", {"-s", server, "-w", "-t", "20"}).exitCode, 0) << jack.Output();

    std::vector<std::string> environment = {"LV2_PATH=" + Parent(ZEN_LV2_BUNDLE), "JACK_DEFAULT_SERVER=" + server,
                                            "JACK_NO_START_SERVER=1"};
    if (*ZEN_SANITIZER_PRELOAD != '\0') {
        environment.push_back(std::string("LD_PRELOAD=") + ZEN_SANITIZER_PRELOAD);
        environment.push_back("ASAN_OPTIONS=detect_leaks=0");
    }
    zentest::LilvHost host(ZEN_LV2_BUNDLE);
    std::size_t shown = 0;
    for (const char* name : {"Limiter", "Meter", "Multiband Compressor"}) {
        // The stereo layout of the plug-in of that name.
        const std::string prefix = std::string(zenlv2::kUriPrefix) + zenlv2::Catalog::PercentEncode(name) + ":";
        std::string uri;
        for (const std::string& candidate : host.PluginUris())
            if (candidate.rfind(prefix, 0) == 0 && candidate.size() > prefix.size() + 7 &&
                candidate.compare(candidate.size() - 7, 7, ":stereo") == 0)
                uri = candidate;
        if (uri.empty()) continue;
        ++shown;
        SCOPED_TRACE(uri);
        Background jalv({"xvfb-run", "-a", "jalv.qt5", uri}, environment);
        // Read before closing: ending the group takes the display away
        // under jalv, which it reports.
        const bool lives = jalv.Lives(2.5);
        const std::string output = jalv.Output();
        jalv.Stop();
        EXPECT_TRUE(lives) << output;
        EXPECT_NE(output.find("UI:"), std::string::npos) << output;
        for (const char* bad : {"failed", "Failed", "error", "Error", "no UI", "No UI"})
            EXPECT_EQ(output.find(bad), std::string::npos) << bad << " in:\n" << output;
    }
    EXPECT_GE(shown, 3u);
}
