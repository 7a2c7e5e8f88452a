// The layouts of the dynamics and tone plug-ins: every parameter sits in a
// group the layout named, and after processing every display draws finite
// curves.
#include <gtest/gtest.h>

#include <QWidget>
#include <cmath>
#include <memory>
#include <string>

#include "Common/Editor/CurveDisplay.h"
#include "Common/Editor/HistoryDisplay.h"
#include "Common/Editor/ZenEditor.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"
#include "Support/TestApplication.h"

namespace {

const char* const kPlugins[] = {"De-Esser",           "Limiter",       "Soft Clipper", "Multiband Compressor",
                                "Dialogue Processor", "Vocal Channel", "De-Hummer",    "LFE Filter",
                                "Distortion",         "Stereo Width",  "Delay",        "Echo"};

}  // namespace

TEST(DynamicsEditorLayouts, PlaceEveryParameterAndDrawFiniteCurvesAfterProcessing) {
    zentest::EnsureApplication();
    for (const char* name : kPlugins) {
        zentest::PluginHarness plugin(name);
        plugin.Prepare(2);
        zentest::Channels audio = {zentest::Noise(4800, 0.5, 1), zentest::Noise(4800, 0.5, 2)};
        plugin.Process(audio);

        std::unique_ptr<ZenEditor> editor(
            qobject_cast<ZenEditor*>(static_cast<QWidget*>(plugin.Audio().CreateEditor(nullptr))));
        ASSERT_NE(editor, nullptr) << name;
        for (std::uint32_t i = 0; i < plugin.Audio().GetParameterCount(); ++i) {
            const QString group = editor->GroupOf(i);
            EXPECT_FALSE(group.isEmpty() || group == "Other") << name << ": parameter " << i;
        }
        editor->RefreshNow();
        ASSERT_FALSE(editor->Displays().empty()) << name;
        for (const EditorDisplay* display : editor->Displays()) {
            if (const auto* curves = qobject_cast<const CurveDisplay*>(display)) {
                std::size_t drawn = 0;
                for (const CurveDisplay::Curve& curve : curves->Curves()) {
                    drawn += curve.points.size();
                    for (const QPointF& p : curve.points)
                        ASSERT_TRUE(std::isfinite(p.x()) && std::isfinite(p.y()))
                            << name << ": " << curve.name.toStdString();
                }
                EXPECT_GT(drawn, 0u) << name;
            } else if (const auto* history = qobject_cast<const HistoryDisplay*>(display)) {
                for (const auto& trace : history->Traces())
                    for (float v : trace) ASSERT_TRUE(std::isfinite(v)) << name;
            }
        }
    }
}
