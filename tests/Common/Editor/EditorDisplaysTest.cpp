// The editor's own displays and layout calls: level bars with their peak
// hold and channel matching, the plot's axes and sampling, the history's
// window, and a class layout that leaves nothing out.
#include <gtest/gtest.h>

#include <QFontMetricsF>
#include <QGroupBox>
#include <cmath>
#include <memory>

#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/HistoryDisplay.h"
#include "Common/Editor/LevelBars.h"
#include "Common/Editor/ParameterControl.h"
#include "Common/Editor/PlotArea.h"
#include "Common/Editor/ZenEditor.h"
#include "Support/FakeEditorLink.h"
#include "Support/TestApplication.h"

namespace {

zen::MeterInfo Meter(const char* name, zen::MeterKind kind, float minimum, float maximum) {
    zen::MeterInfo info;
    info.identifier = std::string("TestEditorLayout::") + name;
    info.name = name;
    info.unit = kind == zen::MeterKind::Level ? "dB" : "";
    info.kind = kind;
    info.minimum = minimum;
    info.maximum = maximum;
    return info;
}

zen::ParameterInfo Knob(const char* name) {
    zen::ParameterInfo info;
    info.identifier = std::string("TestEditorLayout::") + name;
    info.label = name;
    info.minimum = -24.0f;
    info.maximum = 24.0f;
    info.unit = "dB";
    return info;
}

void BuildTestLayout(ZenEditor& editor) {
    editor.AddGroup("Detector", {"THRESHOLD", "NO_SUCH_PARAMETER", "RATIO", "THRESHOLD"});
    editor.AddGroup("Gain", {"THRESHOLD", "MAKEUP"});  // a parameter placed twice keeps its first group
    editor.AddMeters("Input", {"INPUT_PEAK"});
}
const EditorLayoutRegistry::Entry kTestLayout("TestEditorLayout", &BuildTestLayout);

}  // namespace

TEST(LevelBars, TakeEveryChannelOfANameHoldPeaksThenFallAndFollowNewChannels) {
    zentest::EnsureApplication();
    zentest::FakeEditorLink link;
    link.AddMeter(Meter("INPUT_PEAK_1", zen::MeterKind::Level, -60.0f, 6.0f));
    link.AddMeter(Meter("INPUT_PEAK_2", zen::MeterKind::Level, -60.0f, 6.0f));
    link.AddMeter(Meter("INPUT_PEAK_RMS_1", zen::MeterKind::Level, -60.0f, 6.0f));
    link.AddMeter(Meter("CORRELATION", zen::MeterKind::Value, -1.0f, 1.0f));
    LevelBars bars({"INPUT_PEAK", "CORRELATION"});
    bars.Refresh(link);
    ASSERT_EQ(bars.Bars().size(), 3u);
    EXPECT_EQ(bars.Bars()[2].meter, 3u);

    link.meterValues = {-6.0f, -12.0f, 0.0f, -0.5f};
    bars.Refresh(link);
    link.meterValues[0] = -40.0f;
    const int holding = static_cast<int>(LevelBars::kHoldSeconds * ZenEditor::kDisplayRate);
    for (int i = 0; i < holding; ++i) bars.Refresh(link);
    EXPECT_FLOAT_EQ(bars.Bars()[0].hold, -6.0f);
    EXPECT_FLOAT_EQ(bars.Bars()[0].value, -40.0f);
    for (int i = 0; i < ZenEditor::kDisplayRate; ++i) bars.Refresh(link);
    EXPECT_NEAR(bars.Bars()[0].hold, -6.0f - LevelBars::kFallDecibelsPerSecond, 0.8f);
    EXPECT_FLOAT_EQ(bars.Bars()[2].value, -0.5f);

    link.AddMeter(Meter("INPUT_PEAK_3", zen::MeterKind::Level, -60.0f, 6.0f));
    bars.Refresh(link);
    EXPECT_EQ(bars.Bars().size(), 4u);
}

TEST(PlotArea, LogAxisSamplesAndLabelsDecadesAndLevelGridFollowsTheRange) {
    zentest::EnsureApplication();  // fonts
    PlotArea plot;
    plot.SetHorizontal(20.0, 20000.0, PlotArea::Scale::Logarithmic, "Hz");
    const std::vector<double> x = plot.SamplePositions(10);
    ASSERT_EQ(x.size(), 10u);
    EXPECT_DOUBLE_EQ(x.front(), 20.0);
    EXPECT_NEAR(x.back(), 20000.0, 1e-9);
    for (std::size_t i = 1; i < x.size(); ++i) EXPECT_NEAR(x[i] / x[i - 1], std::pow(10.0, 1.0 / 3.0), 1e-9);
    EXPECT_EQ(plot.HorizontalTicks(),
              (std::vector<double>{20, 50, 100, 200, 500, 1000, 2000, 5000, 10000, 20000}));

    plot.SetVertical(-24.0, 24.0, "dB");
    EXPECT_EQ(plot.VerticalStep(), 6.0);
    plot.SetVertical(-60.0, 6.0, "dB");
    EXPECT_EQ(plot.VerticalStep(), 12.0);

    QFont font;
    plot.Layout(QFontMetricsF(font), QRectF(0, 0, 600, 300));
    const QPointF kilohertz = plot.ToPixel(1000.0, -60.0);
    EXPECT_NEAR(plot.ToDataX(kilohertz.x()), 1000.0, 1e-6);
    EXPECT_NEAR(kilohertz.y(), plot.Plot().bottom(), 1e-9);
    // A decade spans the same width everywhere on the axis.
    EXPECT_NEAR(plot.ToPixel(200.0, 0).x() - plot.ToPixel(20.0, 0).x(),
                plot.ToPixel(20000.0, 0).x() - plot.ToPixel(2000.0, 0).x(), 1e-6);
}

TEST(HistoryDisplay, KeepsItsWindowNewestLast) {
    zentest::EnsureApplication();
    zentest::FakeEditorLink link;
    float next = 0.0f;
    HistoryDisplay history("Gain Reduction", -24.0, 0.0, "dB", 2.0,
                           [&](const zen::EditorLink&) { return std::vector<float>{next, -next}; });
    for (int i = 0; i < 100; ++i, next += 1.0f) history.Refresh(link);
    ASSERT_EQ(history.Traces().size(), 2u);
    ASSERT_EQ(history.Traces()[0].size(), static_cast<std::size_t>(2 * ZenEditor::kDisplayRate));
    EXPECT_EQ(history.Traces()[0].back(), 99.0f);
    EXPECT_EQ(history.Traces()[1].front(), -40.0f);
}

TEST(ZenEditor, ClassLayoutPlacesNamedControlsAndPutsTheRestInOther) {
    zentest::EnsureApplication();
    zentest::FakeEditorLink link;
    for (const char* name : {"THRESHOLD", "RATIO", "MAKEUP", "KNEE"}) link.Add(Knob(name));
    link.AddMeter(Meter("INPUT_PEAK_1", zen::MeterKind::Level, -60.0f, 6.0f));
    link.AddMeter(Meter("INPUT_PEAK_2", zen::MeterKind::Level, -60.0f, 6.0f));
    std::unique_ptr<ZenEditor> editor(ZenEditor::Create("TestEditorLayout", "Test", link));

    EXPECT_EQ(editor->FindParameter("RATIO"), 1);
    EXPECT_EQ(editor->FindParameter("TestEditorLayout::KNEE"), 3);
    EXPECT_EQ(editor->FindParameter("NO_SUCH_PARAMETER"), -1);
    EXPECT_EQ(editor->GroupOf(0), "Detector");
    EXPECT_EQ(editor->GroupOf(1), "Detector");
    EXPECT_EQ(editor->GroupOf(2), "Gain");
    EXPECT_EQ(editor->GroupOf(3), "Other");
    EXPECT_EQ(editor->findChildren<ParameterControl*>().size(), 4);
    const QList<LevelBars*> bars = editor->findChildren<LevelBars*>();
    ASSERT_EQ(bars.size(), 1);
    EXPECT_EQ(bars[0]->Bars().size(), 2u);

    // A value set on the link reaches the control and the bars at a refresh.
    link.values[2] = 7.5f;
    link.meterValues[1] = -3.0f;
    editor->RefreshNow();
    EXPECT_EQ(editor->Control(2)->ShownValue(), 7.5f);
    EXPECT_EQ(bars[0]->Bars()[1].value, -3.0f);
}
