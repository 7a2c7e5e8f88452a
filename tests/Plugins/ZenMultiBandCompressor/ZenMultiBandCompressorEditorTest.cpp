// The Multiband Compressor's editor: each drawn crossover band is what the
// plug-in plays with that band soloed, and the bands sum to 0 dB.
#include <gtest/gtest.h>

#include <QWidget>
#include <cmath>
#include <memory>
#include <string>

#include "Common/Editor/CurveDisplay.h"
#include "Common/Editor/ZenEditor.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"
#include "Support/TestApplication.h"

TEST(ZenMultiBandCompressorEditor, DrawnBandsAreTheSoloedBandsAndSumToZeroDb) {
    const float rate = 48000.0f;
    std::vector<std::pair<std::string, float>> settings = {{"ZenMultiBandCompressor::BANDS", 4.0f},
                                                           {"ZenMultiBandCompressor::CROSSOVER_1", 2000.0f},
                                                           {"ZenMultiBandCompressor::CROSSOVER_2", 140.0f},
                                                           {"ZenMultiBandCompressor::CROSSOVER_3", 7000.0f}};
    for (int b = 1; b <= 4; ++b) settings.push_back({"ZenMultiBandCompressor::RATIO_" + std::to_string(b), 1.0f});

    zentest::EnsureApplication();
    std::vector<std::vector<QPointF>> drawn;
    for (int band = 0; band < 4; ++band) {
        auto soloed = settings;
        soloed.push_back({"ZenMultiBandCompressor::SOLO_" + std::to_string(band + 1), 1.0f});
        zentest::PluginHarness plugin = zentest::Prepared("Multiband Compressor", soloed, 1, rate);
        const zentest::Channels out = plugin.Run(zentest::Impulse(32768));
        std::unique_ptr<ZenEditor> editor(
            qobject_cast<ZenEditor*>(static_cast<QWidget*>(plugin.Audio().CreateEditor(nullptr))));
        ASSERT_NE(editor, nullptr);
        editor->RefreshNow();
        const auto* crossover = qobject_cast<const CurveDisplay*>(editor->Displays().at(0));
        ASSERT_NE(crossover, nullptr);
        ASSERT_GE(crossover->Curves().size(), 4u);
        const std::vector<QPointF>& curve = crossover->Curves()[band].points;
        ASSERT_GE(curve.size(), 10u);
        for (std::size_t k = 0; k < 10; ++k) {
            const QPointF p = curve[k * (curve.size() - 1) / 9];
            const double measured = zentest::MagnitudeDb(out[0], p.x(), rate);
            if (measured > -50.0) {
                EXPECT_NEAR(p.y(), measured, 0.1) << "band " << band << ", " << p.x() << " Hz";
            }
        }
        drawn.push_back(curve);
    }
    for (std::size_t i = 0; i < drawn[0].size(); ++i) {
        double sum = 0.0;
        for (const auto& curve : drawn) sum += std::pow(10.0, curve[i].y() / 20.0);
        EXPECT_NEAR(20.0 * std::log10(sum), 0.0, 0.1) << drawn[0][i].x() << " Hz";
    }
}
