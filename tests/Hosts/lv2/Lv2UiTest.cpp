// The bundle's Qt 5 UIs as hosts meet them: described for every plug-in with
// the port notifications its meters need, offered by zen_ui.so under the
// same URIs, refused without a QApplication (the UI never makes one), and
// shown by Debian's jalv.qt5 under Xvfb where those are installed.
#include <dlfcn.h>
#include <lilv/lilv.h>
#include <lv2/ui/ui.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <map>
#include <set>

#include <gtest/gtest.h>

#include "../zenfx/ZenfxRunner.h"
#include "LilvHost.h"

namespace {

std::string Parent(const std::string& folder) { return folder.substr(0, folder.find_last_of('/')); }

std::string Text(const LilvNode* node) { return node ? lilv_node_as_string(node) : ""; }

bool Installed(const char* program) {
    for (const char* folder : {"/usr/bin/", "/usr/local/bin/"})
        if (access((std::string(folder) + program).c_str(), X_OK) == 0) return true;
    return false;
}

// Under xvfb-run: a dummy JACK server of its own, then jalv.qt5 on each URI
// given, closed with Ctrl-C once it has stood for a while; every step of it
// bounded in time.
constexpr const char* kJalvScript = R"(
jackd --no-realtime -n "$ZEN_JACK" -d dummy -r 48000 -p 1024 >/dev/null 2>&1 &
jack=$!
trap 'kill $jack; wait $jack' EXIT
jack_wait -s "$ZEN_JACK" -w -t 20 >/dev/null || exit 90
for uri in "$@"; do
  echo "== start $uri"
  timeout -s KILL 30 jalv.qt5 "$uri" 2>&1 &
  jalv=$!
  sleep 2.5
  if kill -0 $jalv; then kill -INT $jalv; wait $jalv; echo "== closed $?"; else wait $jalv; echo "== ended $?"; fi
done
)";

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
// with only our bundle on LV2_PATH: the UI of every plug-in (its stereo
// layout, else its first) comes up, stands and closes.
TEST(Lv2Ui, JalvQt5ShowsAndClosesTheUiOfEveryPlugin) {
    for (const char* program : {"xvfb-run", "jalv.qt5", "jackd", "jack_wait"})
        if (!Installed(program)) GTEST_SKIP() << program << " is not installed (scripts/install-deps.sh)";
    std::vector<std::string> environment = {"LV2_PATH=" + Parent(ZEN_LV2_BUNDLE), "JACK_NO_START_SERVER=1",
                                            "ZEN_JACK=zen-ui-test-" + std::to_string(getpid()),
                                            "JACK_DEFAULT_SERVER=zen-ui-test-" + std::to_string(getpid())};
    if (*ZEN_SANITIZER_PRELOAD != '\0') {
        environment.push_back(std::string("LD_PRELOAD=") + ZEN_SANITIZER_PRELOAD);
        environment.push_back("ASAN_OPTIONS=detect_leaks=0");
    }
    zentest::LilvHost host(ZEN_LV2_BUNDLE);
    std::map<std::string, std::string> chosen;  // plug-in URI without its layout -> the layout's URI
    for (const std::string& uri : host.PluginUris()) {
        const std::string plugin = uri.substr(0, uri.rfind(':'));
        const bool stereo = uri.size() > 7 && uri.compare(uri.size() - 7, 7, ":stereo") == 0;
        if (chosen.count(plugin) == 0 || stereo) chosen[plugin] = uri;
    }
    std::vector<std::string> arguments = {"-a", "sh", "-c", kJalvScript, "sh"};
    for (const auto& [plugin, uri] : chosen) arguments.push_back(uri);
    ASSERT_GE(chosen.size(), 26u);

    const zentest::ZenfxResult run = zentest::RunProgram("xvfb-run", arguments, environment);
    ASSERT_EQ(run.exitCode, 0) << run.out << run.err;
    for (std::size_t a = 5; a < arguments.size(); ++a) {
        const std::string& uri = arguments[a];
        SCOPED_TRACE(uri);
        const std::size_t start = run.out.find("== start " + uri + "\n");
        ASSERT_NE(start, std::string::npos) << run.out;
        const std::size_t end = run.out.find("== start", start + 1);
        const std::string output = run.out.substr(start, end == std::string::npos ? end : end - start);
        EXPECT_NE(output.find("UI:           " + uri + ":ui"), std::string::npos) << output;
        EXPECT_NE(output.find("== closed 0"), std::string::npos) << output;
        for (const char* bad : {"failed", "Failed", "error", "Error", "no UI", "No UI"})
            EXPECT_EQ(output.find(bad), std::string::npos) << bad << " in:\n" << output;
    }
}
