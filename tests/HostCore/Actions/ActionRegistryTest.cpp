// Host actions as a plug-in calls them: through the registry and through the
// action-call entry of the host services, whose result buffer is the
// plug-in's.
#include <gtest/gtest.h>

#include <cstring>

#include "HostCore/Actions/ActionRegistry.h"
#include "HostCore/Actions/ActionServices.h"
#include "HostCore/HostError.h"

using zen::host::ActionCall;
using zen::host::ActionRegistry;
using zen::host::ActionServices;

namespace {

void AddEchoAndFail(ActionRegistry& registry) {
    registry.Register("Echo", 0, 3, [](const ActionCall& call, std::string& result) {
        result = std::to_string(call.channel);
        for (const std::string& a : call.arguments) result += "|" + a;
        return true;
    });
    registry.Register("Fail", 0, 0, [](const ActionCall&, std::string&) -> bool {
        throw zen::host::HostError("the engine is busy");
    });
}

}  // namespace

TEST(ActionRegistry, UnknownNamesWrongCountsAndThrowingHandlersFailCleanly) {
    ActionRegistry registry;
    AddEchoAndFail(registry);
    std::string result;
    EXPECT_FALSE(registry.Call({"AudioLevellerEngine", {"SetRangePoint", "1", "2", "3"}}, result));
    EXPECT_EQ(result, "unknown action 'AudioLevellerEngine'");
    EXPECT_FALSE(registry.Call({"Echo", {"1", "2", "3", "4"}}, result));
    EXPECT_EQ(result, "'Echo' takes 0 to 3 arguments, not 4");
    EXPECT_FALSE(registry.Call({"Fail", {}}, result));
    EXPECT_EQ(result, "the engine is busy");
    EXPECT_TRUE(registry.Call({"Echo", {"a", "b"}, 4}, result));
    EXPECT_EQ(result, "4|a|b");

    // The first registration of a name stays.
    EXPECT_FALSE(registry.Register("Echo", 0, 0, [](const ActionCall&, std::string&) { return false; }));
    EXPECT_TRUE(registry.Call({"Echo", {}}, result));
    EXPECT_TRUE(registry.Unregister("Echo"));
    EXPECT_FALSE(registry.Contains("Echo"));
    EXPECT_EQ(registry.Names(), std::vector<std::string>{"Fail"});
}

TEST(ActionServices, TheCallEntryCopiesTheResultIntoThePluginsBufferAndKnowsTheChannel) {
    ActionRegistry registry;
    AddEchoAndFail(registry);
    ActionServices services(registry, 7, 99);
    zen::HostServices* self = services.Services();
    EXPECT_EQ(self->GetChannelIndex(self), 7);
    EXPECT_EQ(self->GetSessionId(self), 99);

    const char* arguments[] = {"LoadPlugin", nullptr};
    char buffer[8];
    std::memset(buffer, 'x', sizeof(buffer));
    ASSERT_TRUE(ActionServices::CallAction(self, "Echo", arguments, 2, buffer, sizeof(buffer)));
    EXPECT_STREQ(buffer, "7|LoadP");  // cut to the capacity, always terminated

    EXPECT_FALSE(ActionServices::CallAction(self, "NoSuchAction", nullptr, 0, buffer, sizeof(buffer)));
    EXPECT_STREQ(buffer, "unknown");
    // No buffer, a malformed call: still a clean false.
    EXPECT_FALSE(ActionServices::CallAction(self, "Fail", nullptr, 0, nullptr, 0));
    EXPECT_FALSE(ActionServices::CallAction(self, "Echo", nullptr, 2, buffer, sizeof(buffer)));
    EXPECT_FALSE(ActionServices::CallAction(nullptr, "Echo", nullptr, 0, buffer, sizeof(buffer)));
}
