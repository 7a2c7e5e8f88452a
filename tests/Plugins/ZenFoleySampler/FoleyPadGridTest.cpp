// A pad press plays the pad: it selects it and raises "Trigger" until the
// release, so the audio thread sees one rising edge per press.
#include <gtest/gtest.h>

#include <memory>

#include "Common/Editor/ZenEditor.h"
#include "Plugins/ZenFoleySampler/FoleyPadGrid.h"
#include "Support/PluginHarness.h"
#include "Support/TestApplication.h"

TEST(FoleyPadGrid, APressPlaysThePadOnce) {
    zentest::EnsureApplication();
    zentest::PluginHarness plugin = zentest::Prepared("Foley Sampler", {}, 2);
    // The editor's own link and lookups; the grid under test is a second one on the same link.
    std::unique_ptr<QWidget> widget(static_cast<QWidget*>(plugin.Audio().CreateEditor(nullptr)));
    auto* editor = qobject_cast<ZenEditor*>(widget.get());
    ASSERT_NE(editor, nullptr);
    zen::EditorLink& link = editor->Link();
    const auto index = [&](const char* name, bool meter) {
        const int found = meter ? editor->FindMeter(name) : editor->FindParameter(name);
        EXPECT_GE(found, 0) << name;
        return static_cast<std::uint32_t>(found);
    };
    FoleyPadGrid pads(link, index("PAD", false), index("TRIGGER", false), index("PADS", true),
                      index("ACTIVE_VOICES", true));
    zentest::Channels block(2, std::vector<float>(512, 0.0f));
    plugin.Process(block);
    pads.Refresh(link);
    ASSERT_GE(pads.ShownPads(), 3u) << "the built-in pads";

    pads.Press(3);
    EXPECT_EQ(plugin.Get("ZenFoleySampler::PAD"), 3.0f);
    EXPECT_EQ(plugin.Get("ZenFoleySampler::TRIGGER"), 1.0f);
    plugin.Process(block);
    pads.Release();
    EXPECT_EQ(plugin.Get("ZenFoleySampler::TRIGGER"), 0.0f);
    plugin.Process(block);
    EXPECT_EQ(plugin.Meter("Active Voices"), 1.0f);
    EXPECT_GT(plugin.Meter("Output Peak 1"), -60.0f);
    pads.Refresh(link);
    EXPECT_TRUE(pads.Status().contains("pad 3")) << pads.Status().toStdString();

    // Held down across blocks, a pad still plays once.
    pads.Press(3);
    for (int i = 0; i < 3; ++i) plugin.Process(block);
    pads.Release();
    plugin.Process(block);
    EXPECT_EQ(plugin.Meter("Active Voices"), 2.0f);
}
