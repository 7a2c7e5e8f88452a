// The entry, the registries and the interface object, as a host sees them.
#include <gtest/gtest.h>

#include <cstddef>
#include <cstdio>
#include <memory>
#include <string>
#include <vector>

#include "Common/AudioPluginRegistry.h"
#include "Common/ZenAudioPluginImpl.h"
#include "Common/ZenControlPlugin.h"
#include "Support/AssertionRecorder.h"
#include "zen/Zen.h"

namespace {

// A control plug-in that exists only in the tests.
class TestConsoleSettings : public ZenControlPluginImpl {
public:
    static constexpr const char* kName = "Test Console Settings";
    static constexpr const char* kClassName = "TestConsoleSettings";
    TestConsoleSettings() {
        static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
            kClassName, {zen::ContinuousParameter("TRIM", "Trim", -12.0f, 12.0f, 0.0f, 0.1f, "dB"),
                         zen::SwitchParameter("MUTE", "Mute", 0.0f)});
        InitParameters(table);
    }
};

zen::PluginInstance* CreateNothing(void*, zen::HostServices*, const zen::PluginDescriptor*) { return nullptr; }

std::unique_ptr<zen::PluginInstance> Create(int kind, const char* key) {
    return std::unique_ptr<zen::PluginInstance>(GetZenPluginInterface()->CreatePlugin(kind, key));
}

}  // namespace

template class ZenControlPlugin<TestConsoleSettings>;

TEST(PluginInterface, OneObjectWithVersion100) {
    zen::PluginInterface* library = GetZenPluginInterface();
    ASSERT_NE(library, nullptr);
    EXPECT_EQ(library, GetZenPluginInterface());
    EXPECT_EQ(library->GetInterfaceVersion(), 100);
}

TEST(PluginInterface, KeysAreNameColonDecimalCode) {
    EXPECT_EQ(zen::MakePluginCode('Z', 'n', 'S', 'c'), 1517179747);
    EXPECT_EQ(zen::MakePluginCode('Z', 'e', 'n', 'a'), 1516596833);
    EXPECT_EQ(zen::PluginCodeToString(1517177970), "ZnLr");
    EXPECT_EQ(zen::AudioPluginRegistry::MakeKey("Soft Clipper", 1517179747).toStdString(), "Soft Clipper:1517179747");
    EXPECT_EQ(zen::MakePluginKey("Limiter", 1517177970), "Limiter:1517177970");
}

TEST(PluginInterface, ListsAudioPluginsByKeyAndControlPluginsByName) {
    const auto list = GetZenPluginInterface()->GetPluginList(zen::kAudioPluginKind);
    const auto it = list.find("Soft Clipper:1517179747");
    ASSERT_NE(it, list.end());
    EXPECT_EQ(it->second.name, "Soft Clipper");
    EXPECT_EQ(it->second.channelCount, 32u);
    EXPECT_EQ(it->second.reserved0 | it->second.reserved1 | it->second.listFlags, 0u);
    for (const auto& [key, entry] : list) EXPECT_EQ(key.rfind(entry.name + ":", 0), 0u) << key;
    const auto controls = GetZenPluginInterface()->GetPluginList(zen::kControlPluginKind);
    const auto settings = controls.find("Test Console Settings");
    ASSERT_NE(settings, controls.end());
    EXPECT_EQ(settings->second.name, "Test Console Settings");
    EXPECT_EQ(settings->second.channelCount, 0u);
}

TEST(PluginInterface, CreatesByExactKeyOfItsOwnKindOnly) {
    zen::PluginInterface* library = GetZenPluginInterface();
    for (int kind : {-1, 1, 3, 100}) {
        EXPECT_TRUE(library->GetPluginList(kind).empty()) << kind;
        EXPECT_EQ(library->CreatePlugin(kind, "Soft Clipper:1517179747"), nullptr) << kind;
    }
    for (const char* key : {"soft clipper:1517179747", "Soft Clipper", "Blur:1517175404", "Krush:1517177714"})
        EXPECT_EQ(library->CreatePlugin(zen::kAudioPluginKind, key), nullptr) << key;
    const auto clipper = Create(zen::kAudioPluginKind, "Soft Clipper:1517179747");
    ASSERT_NE(clipper, nullptr);
    EXPECT_EQ(clipper->GetKind(), zen::kAudioPluginKind);
    EXPECT_STREQ(clipper->GetName(), "Soft Clipper");
    // The factory hands over the registry's own descriptor.
    EXPECT_EQ(clipper->GetDescriptor(), &zen::AudioPluginRegistry::Instance().Find("Soft Clipper:1517179747")->descriptor);
    EXPECT_STREQ(clipper->GetDescriptor()->className, "ZenSoftClipper");
}

TEST(PluginInterface, CastsByInterfaceName) {
    const auto clipper = Create(zen::kAudioPluginKind, "Soft Clipper:1517179747");
    EXPECT_EQ(clipper->QueryInterface("zen::PluginInstance"), clipper.get());
    EXPECT_NE(zen::InterfaceCast<AudioPlugin>(clipper.get()), nullptr);
    EXPECT_NE(zen::InterfaceCast<ZenControlValueHost>(clipper.get()), nullptr);
    EXPECT_EQ(zen::InterfaceCast<ControlPlugin>(clipper.get()), nullptr);
    EXPECT_NE(clipper->QueryInterface("QObject"), nullptr);  // passed on to the toolkit
    EXPECT_EQ(clipper->QueryInterface("NoSuchInterface"), nullptr);
    EXPECT_EQ(clipper->QueryInterface(nullptr), nullptr);
}

namespace {

// A host's services with an action table: "Echo" answers its arguments
// joined by commas; every other action is unknown.
struct EchoServices : zen::HostServices {
    EchoServices() : zen::HostServices{sizeof(zen::HostServices), zen::kHostServicesVersion, nullptr, nullptr, nullptr} {
        GetChannelIndex = [](zen::HostServices*) -> std::int64_t { return 7; };
        GetSessionId = [](zen::HostServices*) -> std::int64_t { return 99; };
        CallAction = [](zen::HostServices* self, const char* action, const char* const* arguments,
                        std::uint32_t count, char* result, std::uint32_t capacity) {
            auto* services = static_cast<EchoServices*>(self);
            services->actions.push_back(action);
            if (std::string(action) != "Echo") return false;
            std::string answer;
            for (std::uint32_t i = 0; i < count; ++i) answer += (i > 0 ? "," : "") + std::string(arguments[i]);
            std::snprintf(result, capacity, "%s", answer.c_str());
            return true;
        };
    }
    std::vector<std::string> actions;
};

// Creates the Soft Clipper with these services (and a context) set on the library.
std::unique_ptr<zen::PluginInstance> CreateWithServices(zen::HostServices* services, void* context = nullptr) {
    zen::PluginInterface* library = GetZenPluginInterface();
    library->SetHostContext(context);
    library->SetHostServices(services);
    auto instance = Create(zen::kAudioPluginKind, "Soft Clipper:1517179747");
    library->SetHostServices(nullptr);
    library->SetHostContext(nullptr);
    return instance;
}

}  // namespace

TEST(PluginInterface, HostServicesReachNewInstancesAndRouteActions) {
    EchoServices services;
    int context = 0;
    const auto clipper = CreateWithServices(&services, &context);
    auto* impl = dynamic_cast<ZenAudioPluginImpl*>(clipper.get());
    ASSERT_NE(impl, nullptr);
    EXPECT_EQ(impl->GetHostContext(), &context);
    EXPECT_EQ(impl->GetHostServices(), &services);
    EXPECT_EQ(impl->GetHostChannelIndex(), 7);
    EXPECT_EQ(impl->GetHostSessionId(), 99);

    std::string result = "stale";
    EXPECT_TRUE(impl->CallHostAction("Echo", {"zen:Limiter:1517177970", "2", ""}, &result));
    EXPECT_EQ(result, "zen:Limiter:1517177970,2,");
    EXPECT_TRUE(impl->CallHostAction("Echo"));
    EXPECT_FALSE(impl->CallHostAction("AudioLevellerEngine", {"1"}, &result));  // unknown to this host
    EXPECT_EQ(result, "");
    EXPECT_EQ(services.actions, (std::vector<std::string>{"Echo", "Echo", "AudioLevellerEngine"}));
}

TEST(PluginInterface, AHostWithAnOlderOrNoServicesStructStillWorks) {
    // The struct as a host built before CallAction lays it out, alone on the
    // heap: reading past it would be caught by the address sanitizer.
    struct OlderServices {
        std::uint32_t structSize;
        std::uint32_t version;
        std::int64_t (*GetChannelIndex)(zen::HostServices*);
        std::int64_t (*GetSessionId)(zen::HostServices*);
    };
    static_assert(sizeof(OlderServices) == offsetof(zen::HostServices, CallAction), "the older layout");
    auto older = std::make_unique<OlderServices>(OlderServices{
        sizeof(OlderServices), 0, [](zen::HostServices*) -> std::int64_t { return 3; },
        [](zen::HostServices*) -> std::int64_t { return 42; }});
    auto* services = reinterpret_cast<zen::HostServices*>(older.get());
    const auto clipper = CreateWithServices(services);
    auto* impl = dynamic_cast<ZenAudioPluginImpl*>(clipper.get());
    ASSERT_NE(impl, nullptr);
    EXPECT_EQ(impl->GetHostChannelIndex(), 3);
    EXPECT_EQ(impl->GetHostSessionId(), 42);
    std::string result = "stale";
    EXPECT_FALSE(impl->CallHostAction("LoadPlugin", {"zen:Limiter:1517177970"}, &result));
    EXPECT_EQ(result, "");

    // Shorter still: only the channel index is covered.
    older->structSize = offsetof(zen::HostServices, GetSessionId);
    const auto shorter = CreateWithServices(services);
    EXPECT_EQ(dynamic_cast<ZenAudioPluginImpl&>(*shorter).GetHostChannelIndex(), 3);
    EXPECT_EQ(dynamic_cast<ZenAudioPluginImpl&>(*shorter).GetHostSessionId(), 0);

    // Null entries and no services at all: defaults, and no actions.
    EchoServices empty;
    empty.GetChannelIndex = nullptr;
    empty.CallAction = nullptr;
    const auto partial = CreateWithServices(&empty);
    EXPECT_EQ(dynamic_cast<ZenAudioPluginImpl&>(*partial).GetHostChannelIndex(), -1);
    EXPECT_FALSE(dynamic_cast<ZenAudioPluginImpl&>(*partial).CallHostAction("Echo"));
    const auto alone = CreateWithServices(nullptr);
    EXPECT_EQ(dynamic_cast<ZenAudioPluginImpl&>(*alone).GetHostServices(), nullptr);
    EXPECT_FALSE(dynamic_cast<ZenAudioPluginImpl&>(*alone).CallHostAction("Echo"));
}

TEST(AudioPluginRegistry, WithheldDescriptorsAreNeverEntered) {
    const zen::PluginDescriptor blur = {"Blur", 0.2, zen::kPluginStateWithheld, zen::MakePluginCode('Z', 'n', 'B', 'l'),
                                        8, 8, "ZenBlur", 0, 0, -1, nullptr};
    EXPECT_EQ(blur.code, 1517175404);
    EXPECT_FALSE(zen::AudioPluginRegistry::Instance().Register(blur, &CreateNothing));
    EXPECT_EQ(zen::AudioPluginRegistry::Instance().Find("Blur:1517175404"), nullptr);
}

TEST(PluginRegistries, TheFirstRegistrationWinsWithAnAssertion) {
    zentest::AssertionRecorder assertions;
    auto& registry = zen::AudioPluginRegistry::Instance();
    const zen::AudioPluginRegistry::Node* before = registry.Find("Soft Clipper:1517179747");
    ASSERT_NE(before, nullptr);
    const zen::AudioPluginFactory original = before->factory;
    zen::PluginDescriptor copy = before->descriptor;
    EXPECT_FALSE(registry.Register(copy, &CreateNothing));
    ASSERT_EQ(assertions.Assertions().size(), 1u);
    EXPECT_EQ(assertions.Assertions()[0].message, "0");
    EXPECT_NE(assertions.Assertions()[0].file.find("Common/AudioPluginRegistry"), std::string::npos);
    EXPECT_EQ(registry.Find("Soft Clipper:1517179747")->factory, original);

    EXPECT_FALSE(zen::ControlPluginRegistry::Instance().Register(
        "Test Console Settings", [](zen::HostServices*) -> zen::PluginInstance* { return nullptr; }));
    EXPECT_EQ(assertions.Assertions().size(), 2u);
    const auto settings = Create(zen::kControlPluginKind, "Test Console Settings");
    EXPECT_NE(settings, nullptr);
}

TEST(ControlPlugin, ParametersStateAndCasts) {
    const auto settings = Create(zen::kControlPluginKind, "Test Console Settings");
    ASSERT_NE(settings, nullptr);
    EXPECT_EQ(settings->GetKind(), zen::kControlPluginKind);
    EXPECT_EQ(settings->GetDescriptor(), nullptr);
    EXPECT_EQ(zen::InterfaceCast<AudioPlugin>(settings.get()), nullptr);
    ControlPlugin* control = zen::InterfaceCast<ControlPlugin>(settings.get());
    ASSERT_NE(control, nullptr);
    ASSERT_EQ(control->GetParameterCount(), 2u);
    EXPECT_TRUE(control->SetParameter(0, -4.5f));
    EXPECT_TRUE(control->SetParameter(1, 1.0f));
    EXPECT_FALSE(control->SetParameter(2, 1.0f));
    const std::string state = control->SaveState();

    const auto other = Create(zen::kControlPluginKind, "Test Console Settings");
    ControlPlugin* restored = zen::InterfaceCast<ControlPlugin>(other.get());
    ASSERT_TRUE(restored->LoadState(state));
    EXPECT_FLOAT_EQ(restored->GetParameter(0), -4.5f);
    EXPECT_FLOAT_EQ(restored->GetParameter(1), 1.0f);
}
