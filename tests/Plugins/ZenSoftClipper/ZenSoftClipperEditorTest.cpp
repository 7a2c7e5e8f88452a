// The Soft Clipper's editor: the drawn curve is what the plug-in gives for
// steady levels across the knee, and the operating point from the meters
// lies on it.
#include <gtest/gtest.h>

#include <QWidget>
#include <cmath>
#include <memory>

#include "Common/Editor/CurveDisplay.h"
#include "Common/Editor/ZenEditor.h"
#include "Support/PluginHarness.h"
#include "Support/TestApplication.h"

TEST(ZenSoftClipperEditor, DrawnCurveIsThePluginsOutputAndTheOperatingPointLiesOnIt) {
    // Above 0 dB the threshold drives; below it lowers the knee.
    for (float threshold : {6.0f, -9.0f}) {
        zentest::PluginHarness plugin = zentest::Prepared("Soft Clipper", {{"ZenSoftClipper::THRESHOLD", threshold},
                                                                           {"ZenSoftClipper::SHAPE", 0.6f},
                                                                           {"ZenSoftClipper::OUTPUT_GAIN", -2.0f}});
        zentest::EnsureApplication();
        std::unique_ptr<ZenEditor> editor(
            qobject_cast<ZenEditor*>(static_cast<QWidget*>(plugin.Audio().CreateEditor(nullptr))));
        ASSERT_NE(editor, nullptr);
        editor->RefreshNow();
        const auto* display = qobject_cast<const CurveDisplay*>(editor->Displays().at(0));
        ASSERT_NE(display, nullptr);
        const std::vector<QPointF> curve = display->Curves().at(0).points;
        ASSERT_GE(curve.size(), 20u);

        // Steady levels (the clipper has no memory) at every 12th drawn point.
        for (std::size_t i = 0; i < curve.size(); i += 12) {
            const auto level = static_cast<float>(std::pow(10.0, curve[i].x() / 20.0));
            zentest::Channels block = {std::vector<float>(64, level)};
            plugin.Process(block);
            EXPECT_NEAR(curve[i].y(), 20.0 * std::log10(std::fabs(block[0].back())), 0.01)
                << curve[i].x() << " dB in, threshold " << threshold;
        }

        zentest::Channels loud = {std::vector<float>(64, 1.5f)};
        plugin.Process(loud);
        editor->RefreshNow();
        ASSERT_TRUE(display->Marker().has_value());
        const QPointF m = *display->Marker();
        EXPECT_NEAR(m.x(), 20.0 * std::log10(1.5), 0.01);
        for (std::size_t i = 1; i < curve.size(); ++i)
            if (curve[i - 1].x() <= m.x() && m.x() <= curve[i].x()) {
                const double t = (m.x() - curve[i - 1].x()) / (curve[i].x() - curve[i - 1].x());
                EXPECT_NEAR(m.y(), curve[i - 1].y() + t * (curve[i].y() - curve[i - 1].y()), 0.05);
            }
    }
}
