// The Reverb's editor: "Room Size" and "Room Ratio" set the floor they
// describe, and the room plan places the source where the engine does.
#include <gtest/gtest.h>

#include <cmath>
#include <memory>

#include "Common/Editor/RoomView.h"
#include "Common/Editor/ZenEditor.h"
#include "Support/PluginHarness.h"
#include "Support/TestApplication.h"

TEST(ZenReverbEditor, SizeAndRatioSetTheFloor) {
    zentest::EnsureApplication();
    zentest::PluginHarness plugin = zentest::Prepared("Reverb", {}, 2);
    std::unique_ptr<QWidget> widget(static_cast<QWidget*>(plugin.Audio().CreateEditor(nullptr)));
    auto* editor = qobject_cast<ZenEditor*>(widget.get());
    ASSERT_NE(editor, nullptr);
    ASSERT_EQ(editor->Displays().size(), 2u);  // decay and room

    // Opening the editor leaves the room as it was.
    const float length = plugin.Get("ZenReverb::ROOM_LENGTH");
    editor->RefreshNow();
    EXPECT_EQ(plugin.Get("ZenReverb::ROOM_LENGTH"), length);

    plugin.Set("ZenReverb::ROOM_SIZE", 400.0f);
    plugin.Set("ZenReverb::ROOM_RATIO", 4.0f);
    editor->RefreshNow();
    EXPECT_NEAR(plugin.Get("ZenReverb::ROOM_LENGTH"), 10.0f, 1e-4f);
    EXPECT_NEAR(plugin.Get("ZenReverb::ROOM_WIDTH"), 40.0f, 1e-4f);

    // A floor beyond the room's limits stops at them.
    plugin.Set("ZenReverb::ROOM_RATIO", 100.0f);
    editor->RefreshNow();
    EXPECT_EQ(plugin.Get("ZenReverb::ROOM_LENGTH"), 2.0f);
    EXPECT_EQ(plugin.Get("ZenReverb::ROOM_WIDTH"), 100.0f);

    // The source stays inside 47.5 % of each dimension, as the engine keeps it.
    const QPointF far = RoomView::SourcePosition(4.0f, 6.0f, 50.0f);
    EXPECT_NEAR(std::fabs(far.x()), 0.475 * 4.0, 1e-6);
    EXPECT_NEAR(std::fabs(far.y()), 0.475 * 6.0, 1e-6);
    const QPointF near = RoomView::SourcePosition(40.0f, 40.0f, 3.0f);
    EXPECT_NEAR(std::hypot(near.x(), near.y()), 3.0 * std::cos(0.1 * 3.141592653589793), 1e-4);
}
