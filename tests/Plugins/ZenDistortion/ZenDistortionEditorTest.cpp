// The Distortion's editor: the drawn tone is what the wet path does to a
// signal small enough to pass the curve unbent.
#include <gtest/gtest.h>

#include <QWidget>
#include <memory>

#include "Common/Editor/CurveDisplay.h"
#include "Common/Editor/ZenEditor.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"
#include "Support/TestApplication.h"

TEST(ZenDistortionEditor, DrawnToneIsTheMeasuredResponseOfTheWetPath) {
    for (float tone : {8.0f, -5.0f}) {
        zentest::PluginHarness plugin = zentest::Prepared(
            "Distortion",
            {{"ZenDistortion::DRIVE", 0.0f}, {"ZenDistortion::CURVE", 0.0f}, {"ZenDistortion::TONE", tone}});
        const float scale = 1e-4f;  // "Tape" is a wire this far below its knee
        zentest::Channels out = plugin.Run(zentest::Impulse(65536, 0, scale));
        for (float& x : out[0]) x /= scale;
        zentest::EnsureApplication();
        std::unique_ptr<ZenEditor> editor(
            qobject_cast<ZenEditor*>(static_cast<QWidget*>(plugin.Audio().CreateEditor(nullptr))));
        ASSERT_NE(editor, nullptr);
        editor->RefreshNow();
        const auto* display = qobject_cast<const CurveDisplay*>(editor->Displays().at(1));
        ASSERT_NE(display, nullptr);
        const std::vector<QPointF>& curve = display->Curves().at(0).points;
        for (std::size_t k = 0; k < 10; ++k) {
            const QPointF p = curve[k * (curve.size() - 1) * 8 / 90];  // 20 Hz to about 10 kHz
            EXPECT_NEAR(p.y(), zentest::MagnitudeDb(out[0], p.x(), 48000.0), 0.1) << p.x() << " Hz, tone " << tone;
        }
    }
}
