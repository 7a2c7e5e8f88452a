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

    EXPECT_FALSE(Call(studio, dialog, "SetIntParameter", {"1", "Loudness", "10"}, &result));
    EXPECT_EQ(result, "'Soft Clipper' has no parameter 'Loudness'");
    EXPECT_FALSE(Call(studio, dialog, "SetIntParameter", {"7", "Threshold", "10"}, &result));
    EXPECT_EQ(result, "channel 'Dialog' has no slot 7 (it has 2)");
    EXPECT_FALSE(Call(studio, dialog, "LoadPlugin", {"zen:Nothing:1"}, &result));
    EXPECT_FALSE(Call(studio, dialog, "AudioLevellerEngine", {"NormaliseClips", "0", "1", "2"}, &result));
    EXPECT_EQ(result, "unknown action 'AudioLevellerEngine'");
}
