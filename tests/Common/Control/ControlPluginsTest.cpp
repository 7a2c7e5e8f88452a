// The six control plug-ins as a host meets them: listed by kind 2 under
// their exact names, created by key, settings round-tripping through their
// state, parameters and state telling the same story.
#include <gtest/gtest.h>

#include <memory>
#include <random>
#include <set>

#include "Common/Control/ZenSettingsControl.h"
#include "HostCore/Settings/Documents/BChainDocument.h"
#include "HostCore/Settings/Documents/ConsoleDocuments.h"
#include "HostCore/Settings/Documents/RemoteControlDocument.h"
#include "HostCore/Settings/Documents/TalkbackDocument.h"
#include "HostCore/Settings/SettingsDocument.h"
#include "HostCore/Settings/RandomDocuments.h"
#include "zen/Zen.h"

using zen::host::SettingsDocument;

namespace {

const char* const kControlPlugins[] = {"B-Chain Control",     "I/O Interface Settings",  "Test Tones Settings",
                                       "Performance Testing", "Remote Control Settings", "TalkbackSettings"};

std::unique_ptr<zen::PluginInstance> Create(const std::string& name) {
    return std::unique_ptr<zen::PluginInstance>(GetZenPluginInterface()->CreatePlugin(zen::kControlPluginKind, name));
}

const zen::host::DocumentSchema& SchemaOf(ControlPlugin& control) {
    return *zen::host::FindConsoleDocument(zen::host::DocumentRoot(control.SaveState()));
}

}  // namespace

TEST(ControlPlugins, EachIsListedByKindTwoAndCreatedByItsExactName) {
    const auto list = GetZenPluginInterface()->GetPluginList(zen::kControlPluginKind);
    std::set<std::string> roots;
    for (const char* name : kControlPlugins) {
        ASSERT_EQ(list.count(name), 1u) << name;
        EXPECT_EQ(list.at(name).name, name);
        EXPECT_EQ(list.at(name).channelCount, 0u);
        const auto instance = Create(name);
        ASSERT_NE(instance, nullptr) << name;
        EXPECT_EQ(instance->GetKind(), zen::kControlPluginKind);
        EXPECT_STREQ(instance->GetName(), name);
        EXPECT_EQ(zen::InterfaceCast<AudioPlugin>(instance.get()), nullptr);
        ControlPlugin* control = zen::InterfaceCast<ControlPlugin>(instance.get());
        ASSERT_NE(control, nullptr) << name;
        roots.insert(SchemaOf(*control).root);
    }
    EXPECT_EQ(roots.size(), 6u);  // one document each
    for (const char* wrong : {"Talkback Settings", "b-chain control", "BChainSettings"})
        EXPECT_EQ(Create(wrong), nullptr) << wrong;
}

TEST(ControlPlugins, RandomValidSettingsRoundTripThroughTheStateUnchanged) {
    std::mt19937 random(5);
    for (const char* name : kControlPlugins) {
        const auto instance = Create(name);
        ASSERT_NE(instance, nullptr) << name;
        ControlPlugin& control = *zen::InterfaceCast<ControlPlugin>(instance.get());
        const auto& schema = SchemaOf(control);
        EXPECT_EQ(SettingsDocument::Parse(schema, control.SaveState(), name), SettingsDocument(schema));
        for (int i = 0; i < 10; ++i) {
            const SettingsDocument original = zentest::RandomDocument(schema, random);
            ASSERT_TRUE(control.LoadState(original.ToXml())) << name;
            const std::string saved = control.SaveState();
            ASSERT_EQ(SettingsDocument::Parse(schema, saved, name), original) << name << ":\n" << saved;
            // And into a fresh instance.
            const auto other = Create(name);
            ControlPlugin& copy = *zen::InterfaceCast<ControlPlugin>(other.get());
            ASSERT_TRUE(copy.LoadState(saved));
            for (std::uint32_t p = 0; p < control.GetParameterCount(); ++p)
                ASSERT_EQ(copy.GetParameter(p), control.GetParameter(p)) << name << " parameter " << p;
        }
    }
}

TEST(ControlPlugins, ParametersAreTheNumericSettingsAndRefusedStateChangesNothing) {
    const auto instance = Create("B-Chain Control");
    ControlPlugin& control = *zen::InterfaceCast<ControlPlugin>(instance.get());
    auto& values = *zen::InterfaceCast<ZenControlValueHost>(instance.get());
    using B = zen::host::BChainDocument;
    EXPECT_EQ(control.GetParameterCount(), B::kChannels * (3 + B::kBands * B::kBandFieldCount));
    const std::int32_t gain = values.FindParameter("BChainSettings::CHANNEL3_GAIN");
    const std::int32_t frequency = values.FindParameter("Channel 2 EQ 4 Frequency");
    const std::int32_t polarity = values.FindParameter("BChainSettings::CHANNEL1_POLARITY");
    ASSERT_GE(gain, 0);
    ASSERT_GE(frequency, 0);
    ASSERT_GE(polarity, 0);
    zen::ParameterInfo info;
    ASSERT_TRUE(control.GetParameterInfo(static_cast<std::uint32_t>(frequency), info));
    EXPECT_EQ(info.unit, "Hz");
    EXPECT_EQ(info.taper, zen::ParameterTaper::Logarithmic);
    EXPECT_EQ(info.defaultValue, 8000.0f);  // the fourth band's own default
    ASSERT_TRUE(control.GetParameterInfo(static_cast<std::uint32_t>(polarity), info));
    EXPECT_EQ(info.choices, (std::vector<std::string>{"normal", "inverted"}));

    EXPECT_TRUE(control.SetParameter(static_cast<std::uint32_t>(gain), -4.5f));
    EXPECT_TRUE(control.SetParameter(static_cast<std::uint32_t>(polarity), 1.0f));
    EXPECT_TRUE(control.SetParameter(static_cast<std::uint32_t>(frequency), 99999.0f));  // clamped
    const SettingsDocument d = SettingsDocument::Parse(B::Schema(), control.SaveState(), "state");
    EXPECT_EQ(d.Number(B::kChannelSection, 2, B::kGain), -4.5);
    EXPECT_EQ(d.Format(B::kChannelSection, 0, B::kPolarity), "inverted");
    EXPECT_EQ(d.Number(B::kChannelSection, 1, B::BandField(3, B::kBandFrequency)), 20000.0);

    const std::string before = control.SaveState();
    for (const std::string& bad :
         {std::string("{\"parameters\": {}}"), before.substr(0, before.size() / 2),
          std::string("<BChainSettings><Channel number=\"17\"/></BChainSettings>"), std::string("<TalkbackSettings/>")})
        EXPECT_FALSE(control.LoadState(bad)) << bad;
    EXPECT_EQ(control.SaveState(), before);

    // Integer settings hold whole numbers; lists live in the document only.
    const auto remote = Create("Remote Control Settings");
    ControlPlugin& remoteControl = *zen::InterfaceCast<ControlPlugin>(remote.get());
    ASSERT_EQ(remoteControl.GetParameterCount(), 1u);  // the OSC port
    EXPECT_TRUE(remoteControl.SetParameter(0, 9000.6f));
    EXPECT_EQ(remoteControl.GetParameter(0), 9001.0f);
    SettingsDocument withBinding(zen::host::RemoteControlDocument::Schema());
    withBinding.Set("binding1.parameter", "Ceiling");
    withBinding.Set("binding1.slot", "3");
    ASSERT_TRUE(remoteControl.LoadState(withBinding.ToXml()));
    EXPECT_EQ(SettingsDocument::Parse(withBinding.Schema(), remoteControl.SaveState(), "state"), withBinding);
}
