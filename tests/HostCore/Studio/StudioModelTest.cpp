// The studio model: chains in order with bypass and latency, and the host
// actions a plug-in calls on its own channel.
#include <gtest/gtest.h>

#include "Common/ZenAudioPluginImpl.h"
#include "HostCore/HostError.h"
#include "HostCore/Studio/StudioModel.h"
#include "Support/Signals.h"

using zen::host::ActionServices;
using zen::host::StudioModel;

namespace {

bool Call(StudioModel& studio, std::size_t channel, const char* action, std::vector<const char*> arguments,
          std::string* result = nullptr) {
    char buffer[256] = {};
    const bool ok =
        ActionServices::CallAction(studio.GetChannel(channel).services->Services(), action, arguments.data(),
                                   static_cast<std::uint32_t>(arguments.size()), buffer, sizeof(buffer));
    if (result) *result = buffer;
    return ok;
}

}  // namespace

TEST(StudioModel, ChannelsRunTheirChainsInOrderWithBypassAndLatency) {
    StudioModel studio(*GetZenPluginInterface());
    const std::size_t vocal = studio.AddChannel("Vocal", 1);
    studio.InsertPlugin(vocal, "Test Delay");
    studio.InsertPlugin(vocal, "zen:Test Delay:1517569132");
    studio.PluginAt(vocal, 0).SetParameter(0, 10.0f);
    studio.PluginAt(vocal, 1).SetParameter(0, 5.0f);
    studio.PluginAt(vocal, 1).SetParameter(2, 1.0f);  // inverted
    studio.Prepare(48000, 64);
    EXPECT_EQ(studio.Latency(vocal), 15u);
    std::vector<float> x = zentest::Impulse(64);
    float* buffers[] = {x.data()};
    ASSERT_TRUE(studio.Process(vocal, buffers, 64));
    EXPECT_EQ(zentest::ArgPeak(x), 15u);
    EXPECT_FLOAT_EQ(x[15], -1.0f);

    // Bypass keeps the latency; moving slots changes the order, not the sum.
    studio.SetBypass(vocal, 1, true);
    studio.MovePlugin(vocal, 1, 0);
    EXPECT_TRUE(studio.PluginAt(vocal, 0).IsBypassed());
    EXPECT_EQ(studio.Latency(vocal), 15u);
    studio.RemovePlugin(vocal, 0);
    EXPECT_EQ(studio.Latency(vocal), 10u);

    EXPECT_THROW(studio.InsertPlugin(vocal, "No Such Plug-in"), zen::host::HostError);
    EXPECT_THROW(studio.InsertPlugin(vocal, "Test Delay", 5), zen::host::HostError);
    EXPECT_FALSE(studio.Process(99, buffers, 64));
}

// A refused layout names what the plug-in takes; a channel whose source is
// narrower offers the first slot that many inputs.
TEST(StudioModel, RefusedLayoutsSayWhatThePluginTakes) {
    StudioModel studio(*GetZenPluginInterface());
    const auto refusal = [&](std::size_t channel) {
        try {
            studio.InsertPlugin(channel, "Test Delay");
        } catch (const zen::host::HostError& e) {
            return std::string(e.what());
        }
        return std::string("accepted");
    };
    EXPECT_EQ(refusal(studio.AddChannel("Wide", 3)), "'Test Delay' does not accept 3 channels (it takes 1 or 2)");
    EXPECT_EQ(refusal(studio.AddChannel("Mono source", 2, 1)), "'Test Delay' does not take 1 channel in and 2 out");
    EXPECT_THROW(studio.AddChannel("Narrowing", 1, 2), zen::host::HostError);
}

TEST(StudioModel, PluginsActOnTheirOwnChannelThroughHostActions) {
    StudioModel studio(*GetZenPluginInterface(), 42);
    studio.AddChannel("Music", 2);
    const std::size_t dialog = studio.AddChannel("Dialog", 2);
    studio.Prepare(48000, 128);
    std::string result;
    ASSERT_TRUE(Call(studio, dialog, "LoadPlugin", {"zen:Soft Clipper:1517179747", "0"}, &result)) << result;
    EXPECT_EQ(result, "0");
    ASSERT_TRUE(Call(studio, dialog, "LoadPlugin", {"zen:Test Delay:1517569132", "0"}));
    EXPECT_EQ(studio.GetChannel(0).chain.size(), 0u);
    ASSERT_EQ(studio.GetChannel(dialog).chain.size(), 2u);
    EXPECT_EQ(studio.GetChannel(dialog).chain[1].name, "Soft Clipper");

    // The instance was told its channel and session at creation.
    auto* impl = dynamic_cast<ZenAudioPluginImpl*>(studio.GetChannel(dialog).chain[1].instance.get());
    ASSERT_NE(impl, nullptr);
    EXPECT_EQ(impl->GetHostChannelIndex(), static_cast<std::int64_t>(dialog));
    EXPECT_EQ(impl->GetHostSessionId(), 42);

    // SetIntParameter carries tenths: -35 is -3.5 dB.
    ASSERT_TRUE(Call(studio, dialog, "SetIntParameter", {"1", "Threshold", "-35"}, &result)) << result;
    EXPECT_FLOAT_EQ(studio.PluginAt(dialog, 1).GetParameter(0), -3.5f);
    ASSERT_TRUE(Call(studio, dialog, "SetParameter", {"1", "ZenSoftClipper::SHAPE", "0.25"}));
    ASSERT_TRUE(Call(studio, dialog, "GetParameter", {"1", "Shape"}, &result));
    EXPECT_EQ(result, "0.25");
    ASSERT_TRUE(Call(studio, dialog, "SetBypass", {"0", "1"}));
    EXPECT_TRUE(studio.PluginAt(dialog, 0).IsBypassed());

    EXPECT_FALSE(Call(studio, dialog, "SetParameter", {"1", "Loudness", "10"}, &result));
    EXPECT_EQ(result, "'Soft Clipper' has no parameter 'Loudness'");
    EXPECT_FALSE(Call(studio, dialog, "SetIntParameter", {"7", "Threshold", "10"}, &result));
    EXPECT_EQ(result, "channel 'Dialog' has no slot 7 (it has 2)");
    EXPECT_FALSE(Call(studio, dialog, "LoadPlugin", {"zen:Nothing:1"}, &result));
    EXPECT_FALSE(Call(studio, dialog, "Transcribe", {"0", "1", "2"}, &result));
    EXPECT_EQ(result, "unknown action 'Transcribe'");
}

namespace {

// An action as the plug-in in `slot` sends it, through its own services.
bool CallFrom(StudioModel& studio, std::size_t channel, std::size_t slot, const char* action,
              std::vector<const char*> arguments, std::string* result = nullptr) {
    char buffer[256] = {};
    const bool ok = ActionServices::CallAction(studio.GetChannel(channel).chain[slot].services->Services(), action,
                                               arguments.data(), static_cast<std::uint32_t>(arguments.size()),
                                               buffer, sizeof(buffer));
    if (result) *result = buffer;
    return ok;
}

float Value(StudioModel& studio, std::size_t channel, std::size_t slot, const char* label) {
    AudioPlugin& plugin = studio.PluginAt(channel, slot);
    for (std::uint32_t i = 0; i < plugin.GetParameterCount(); ++i) {
        zen::ParameterInfo info;
        if (plugin.GetParameterInfo(i, info) && info.label == label) return plugin.GetParameter(i);
    }
    ADD_FAILURE() << "no parameter " << label;
    return 0.0f;
}

}  // namespace

// Template integers are tenths: of the value itself (Dialogue Processor), or
// of per-mille along the control (Limiter, Reverb, Distortion, Stereo Width).
TEST(StudioModel, SetIntParameterReadsEachParametersHostScale) {
    StudioModel studio(*GetZenPluginInterface());
    const std::size_t c = studio.AddChannel("FX", 2);
    for (const char* plugin : {"Dialogue Processor", "Limiter", "Reverb", "Distortion", "Stereo Width"})
        studio.InsertPlugin(c, plugin);
    std::vector<std::string> debug;
    studio.SetDebugOutput([&](const std::string& message) { debug.push_back(message); });
    std::vector<StudioModel::ActionRecord> log;
    studio.SetActionObserver([&](const StudioModel::ActionRecord& record) { log.push_back(record); });
    const auto set = [&](const char* slot, const char* parameter, const char* integer) {
        std::string result;
        EXPECT_TRUE(Call(studio, c, "SetIntParameter", {slot, parameter, integer}, &result)) << result;
    };

    set("0", "Exp Speed", "10000");
    set("0", "De-Pop Amount", "8");  // 0.85 sent toward zero
    set("0", "Expander", "10");
    EXPECT_FLOAT_EQ(Value(studio, c, 0, "Exp Speed"), 1000.0f);
    EXPECT_FLOAT_EQ(Value(studio, c, 0, "De-Pop Amount"), 0.8f);
    EXPECT_FLOAT_EQ(Value(studio, c, 0, "Expander"), 1.0f);

    set("1", "Soft", "10000");
    set("1", "Input Gain", "5000");
    EXPECT_FLOAT_EQ(Value(studio, c, 1, "Soft"), 1.0f);
    EXPECT_NEAR(Value(studio, c, 1, "Input Gain"), 0.0f, 1e-5f);
    set("1", "Input Gain", "9000");  // 0.9 of -18..18
    EXPECT_NEAR(Value(studio, c, 1, "Input Gain"), 14.4f, 1e-4f);

    // The reverb defaults of the effects template, each inside its range.
    set("2", "Dry/Wet", "2450");
    set("2", "T@-60dB", "4180");
    set("2", "Room Length", "4490");
    set("2", "Early Refl. Gain", "9000");
    EXPECT_NEAR(Value(studio, c, 2, "Dry/Wet"), 24.5f, 1e-4f);
    EXPECT_NEAR(Value(studio, c, 2, "T@-60dB"), 0.1f * std::pow(200.0f, 0.418f), 0.01f);  // logarithmic taper
    EXPECT_NEAR(Value(studio, c, 2, "Room Length"), 1.0f + 0.449f * 99.0f, 1e-3f);
    EXPECT_NEAR(Value(studio, c, 2, "Early Refl. Gain"), 4.8f, 1e-4f);

    // Distortion "Ceiling" at 1000 - amount: an amount of 250 sits at -6 dB;
    // places outside 0..1000 clamp; a list is set by its place too.
    set("3", "Ceiling", "7500");
    set("3", "Output Level", "-500");
    set("3", "Curve", "10000");
    EXPECT_NEAR(Value(studio, c, 3, "Ceiling"), -6.0f, 1e-4f);
    EXPECT_FLOAT_EQ(Value(studio, c, 3, "Output Level"), -24.0f);
    EXPECT_FLOAT_EQ(Value(studio, c, 3, "Curve"), 3.0f);

    // "Internal Bypass" is the host's bypass of any plug-in; a parameter the
    // target lacks is skipped, answered true, and only said as debug output.
    set("4", "Internal Bypass", "10000");
    EXPECT_TRUE(studio.PluginAt(c, 4).IsBypassed());
    set("4", "Internal Bypass", "0");
    EXPECT_FALSE(studio.PluginAt(c, 4).IsBypassed());
    set("2", "Diffusion", "3500");
    ASSERT_EQ(debug.size(), 1u);
    EXPECT_EQ(debug[0], "skipped: 'Reverb' has no parameter 'Diffusion'");

    ASSERT_EQ(log.size(), 16u);
    EXPECT_EQ(log[4].target, "Limiter");
    EXPECT_TRUE(log[4].parameterSet);
    EXPECT_EQ(log[4].parameter.label, "Input Gain");
    EXPECT_EQ(log[4].parameter.unit, "dB");
    EXPECT_EQ(log[13].note, "bypassed");
    EXPECT_FALSE(log[15].parameterSet);
    EXPECT_TRUE(log[15].ok);

    std::string result;
    EXPECT_FALSE(Call(studio, c, "SetIntParameter", {"1", "Soft", "2.5"}, &result));
    EXPECT_EQ(result, "'2.5' is not a whole number of tenths");
    EXPECT_FALSE(log.back().ok);
}

// "LoadPlugin" without a slot inserts right after its caller; "FindPlugin"
// matches the whole identifier, so two plug-ins with one number differ.
TEST(StudioModel, TemplatesFindAndLoadTheirTargetsAfterTheCaller) {
    StudioModel studio(*GetZenPluginInterface());
    studio.AddChannel("Music", 2);
    const std::size_t c = studio.AddChannel("SFX", 2);
    studio.InsertPlugin(c, "Soft Clipper");
    studio.InsertPlugin(c, "Test Delay");
    studio.Prepare(48000, 64);
    std::string result;
    ASSERT_TRUE(CallFrom(studio, c, 0, "FindPlugin", {"zen:Distortion:1516596851"}, &result));
    EXPECT_EQ(result, "");
    ASSERT_TRUE(CallFrom(studio, c, 0, "LoadPlugin", {"zen:Distortion:1516596851"}, &result)) << result;
    EXPECT_EQ(result, "1");
    ASSERT_TRUE(CallFrom(studio, c, 0, "LoadPlugin", {"zen:Stereo Width:1516596851", "after"}, &result));
    EXPECT_EQ(result, "1");
    // The chain: Soft Clipper, Stereo Width, Distortion, Test Delay.
    const auto find = [&](const char* identifier) {
        EXPECT_TRUE(CallFrom(studio, c, 3, "FindPlugin", {identifier}, &result));
        return result;
    };
    EXPECT_EQ(find("zen:Distortion:1516596851"), "2");
    EXPECT_EQ(find("zen:Stereo Width:1516596851"), "1");
    EXPECT_EQ(find("Test Delay"), "3");
    EXPECT_EQ(find("zen:Distortion:1516596852"), "");
    EXPECT_EQ(find("zen:Limiter:1517177970"), "");

    // The caller is known after the chain moved; outside any slot, "LoadPlugin"
    // appends, and an explicit slot still wins.
    studio.MovePlugin(c, 0, 3);
    ASSERT_TRUE(CallFrom(studio, c, 3, "LoadPlugin", {"Limiter"}, &result));
    EXPECT_EQ(result, "4");
    ASSERT_TRUE(Call(studio, c, "LoadPlugin", {"Limiter"}, &result));
    EXPECT_EQ(result, "5");
    ASSERT_TRUE(CallFrom(studio, c, 3, "LoadPlugin", {"Test Delay", "0"}, &result));
    EXPECT_EQ(result, "0");
    EXPECT_EQ(studio.GetChannel(0).chain.size(), 0u);
}

// The "AI" plug-in's template loads its targets from its background task,
// while RunBackgroundTasks walks the chain; later rounds find them again and
// only follow the controls.
TEST(StudioModel, BackgroundTasksLetATemplateBuildAndFollowItsChain) {
    StudioModel studio(*GetZenPluginInterface());
    const std::size_t c = studio.AddChannel("SFX", 2);
    studio.InsertPlugin(c, "Soft Clipper");
    studio.InsertPlugin(c, "AI");
    studio.InsertPlugin(c, "Test Delay");
    AudioPlugin& ai = studio.PluginAt(c, 1);
    const auto index = [&](const char* label) {
        auto* controls = zen::InterfaceCast<ZenControlValueHost>(studio.GetChannel(c).chain[1].instance.get());
        return static_cast<std::uint32_t>(controls->FindParameter(label));
    };
    ai.SetParameter(index("Template"), 2.0f);  // AI_SFX
    ai.SetParameter(index("Crunch"), 1.0f);
    std::vector<StudioModel::ActionRecord> log;
    studio.SetActionObserver([&](const StudioModel::ActionRecord& record) { log.push_back(record); });
    studio.Prepare(48000, 256);
    studio.RunBackgroundTasks(c, false);

    const auto names = [&] {
        std::vector<std::string> list;
        for (const auto& slot : studio.GetChannel(c).chain) list.push_back(slot.name);
        return list;
    };
    ASSERT_EQ(names(), (std::vector<std::string>{"Soft Clipper", "AI", "Reverb", "Distortion", "Test Delay"}));
    EXPECT_FALSE(studio.PluginAt(c, 3).IsBypassed());  // "Crunch" on
    EXPECT_TRUE(studio.PluginAt(c, 2).IsBypassed());   // reverb off
    EXPECT_NEAR(Value(studio, c, 2, "Dry/Wet"), 24.5f, 1e-4f);
    for (const auto& record : log) EXPECT_TRUE(record.ok) << record.action << " " << record.result;

    log.clear();
    ai.SetParameter(index("Crunch"), 0.0f);
    studio.RunBackgroundTasks(c, false);
    EXPECT_EQ(names().size(), 5u);
    EXPECT_TRUE(studio.PluginAt(c, 3).IsBypassed());
    ASSERT_EQ(log.size(), 1u);
    EXPECT_EQ(log[0].note, "bypassed");
    std::vector<float> left(256, 0.25f), right(256, -0.25f);
    float* buffers[] = {left.data(), right.data()};
    EXPECT_TRUE(studio.Process(c, buffers, 256));
}
