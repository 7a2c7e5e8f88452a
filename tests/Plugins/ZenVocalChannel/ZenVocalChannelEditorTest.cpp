// The Vocal Channel's editor: the drawn low cut and EQ are what the strip
// does to an impulse, and the compressor's operating point sits at the level
// its detector settles to, with the reduction its meter reads.
#include <gtest/gtest.h>

#include <QWidget>
#include <cmath>
#include <memory>

#include "Common/Editor/CurveDisplay.h"
#include "Common/Editor/ZenEditor.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"
#include "Support/TestApplication.h"

namespace {

std::unique_ptr<ZenEditor> EditorOf(zentest::PluginHarness& plugin) {
    zentest::EnsureApplication();
    std::unique_ptr<ZenEditor> editor(
        qobject_cast<ZenEditor*>(static_cast<QWidget*>(plugin.Audio().CreateEditor(nullptr))));
    if (editor) editor->RefreshNow();
    return editor;
}

const CurveDisplay* Display(const ZenEditor& editor, std::size_t index) {
    return index < editor.Displays().size() ? qobject_cast<const CurveDisplay*>(editor.Displays()[index]) : nullptr;
}

}  // namespace

TEST(ZenVocalChannelEditor, DrawnEqIsTheMeasuredResponseAtTenFrequencies) {
    for (float rate : {44100.0f, 96000.0f}) {
        zentest::PluginHarness plugin = zentest::Prepared("Vocal Channel",
                                                          {{"ZenVocalChannel::LOW_CUT", 1.0f},
                                                           {"ZenVocalChannel::LOW_CUT_FREQ", 110.0f},
                                                           {"ZenVocalChannel::LOW_CUT_SLOPE", 1.0f},
                                                           {"ZenVocalChannel::GATE", 0.0f},
                                                           {"ZenVocalChannel::LOW_GAIN", 5.0f},
                                                           {"ZenVocalChannel::LOW_FREQ", 220.0f},
                                                           {"ZenVocalChannel::MID_GAIN", -7.5f},
                                                           {"ZenVocalChannel::MID_FREQ", 1800.0f},
                                                           {"ZenVocalChannel::MID_Q", 2.5f},
                                                           {"ZenVocalChannel::HIGH_GAIN", 4.0f},
                                                           {"ZenVocalChannel::HIGH_FREQ", 7000.0f},
                                                           {"ZenVocalChannel::COMPRESSOR", 0.0f},
                                                           {"ZenVocalChannel::DEESS", 0.0f}},
                                                          1, rate);
        const zentest::Channels out = plugin.Run(zentest::Impulse(32768));
        auto editor = EditorOf(plugin);
        ASSERT_NE(editor, nullptr);
        const CurveDisplay* eq = Display(*editor, 0);
        ASSERT_NE(eq, nullptr);
        ASSERT_FALSE(eq->Curves().empty());
        const std::vector<QPointF>& curve = eq->Curves()[0].points;
        ASSERT_GE(curve.size(), 10u);
        for (std::size_t k = 0; k < 10; ++k) {
            const QPointF p = curve[k * (curve.size() - 1) / 9];
            EXPECT_NEAR(p.y(), zentest::MagnitudeDb(out[0], p.x(), rate), 0.1) << p.x() << " Hz at " << rate;
        }
    }
}

TEST(ZenVocalChannelEditor, CompressorOperatingPointIsTheDetectorsLevelAndTheMetersReduction) {
    zentest::PluginHarness plugin = zentest::Prepared("Vocal Channel", {{"ZenVocalChannel::LOW_CUT", 0.0f},
                                                                        {"ZenVocalChannel::GATE", 0.0f},
                                                                        {"ZenVocalChannel::DEESS", 0.0f},
                                                                        {"ZenVocalChannel::COMPRESSOR", 1.0f},
                                                                        {"ZenVocalChannel::COMP_THRESHOLD", -30.0f},
                                                                        {"ZenVocalChannel::COMP_RATIO", 4.0f},
                                                                        {"ZenVocalChannel::COMP_MAKEUP", 2.0f}});
    // RMS of a sine at half scale: -9.03 dBFS, 21 dB over the threshold.
    plugin.Run(zentest::Sine(1000.0, 48000.0, 48000, 0.5));
    const double rmsDb = 20.0 * std::log10(0.5 / std::sqrt(2.0));
    const float reduction = plugin.Meter("Comp Reduction");
    EXPECT_NEAR(reduction, -21.0 * 0.75, 0.3);

    auto editor = EditorOf(plugin);
    ASSERT_NE(editor, nullptr);
    const CurveDisplay* transfer = Display(*editor, 1);
    ASSERT_NE(transfer, nullptr);
    ASSERT_TRUE(transfer->Marker().has_value());
    EXPECT_NEAR(transfer->Marker()->x(), rmsDb, 0.3);
    EXPECT_NEAR(transfer->Marker()->y() - transfer->Marker()->x(), reduction + 2.0, 0.05);
    // On the drawn curve.
    const std::vector<QPointF>& curve = transfer->Curves().at(1).points;
    for (std::size_t i = 1; i < curve.size(); ++i)
        if (curve[i - 1].x() <= transfer->Marker()->x() && transfer->Marker()->x() <= curve[i].x()) {
            const double t = (transfer->Marker()->x() - curve[i - 1].x()) / (curve[i].x() - curve[i - 1].x());
            EXPECT_NEAR(transfer->Marker()->y(), curve[i - 1].y() + t * (curve[i].y() - curve[i - 1].y()), 0.1);
        }
}
