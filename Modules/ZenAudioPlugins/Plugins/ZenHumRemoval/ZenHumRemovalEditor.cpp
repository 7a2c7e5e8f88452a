// Editor of "De-Hummer": the notch comb the cancellers make at the tracked
// fundamental (from the bank's own steady-state transfer at the live
// width, harmonics and amount), the tracked frequency and the hum found.
#include <algorithm>
#include <cmath>
#include <memory>

#include "Common/Algorithms/TrackingNotchBank.h"
#include "Common/Editor/CurveDisplay.h"
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/HistoryDisplay.h"
#include "Common/Editor/MeterReader.h"
#include "Common/Editor/ZenEditor.h"
#include "ZenHumRemoval.h"

namespace {

constexpr int kResponsePoints = 600;  // the notches are narrow
constexpr double kHistorySeconds = 10.0;
constexpr double kFloorDb = -60.0;

struct Comb {
    float rate = 0.0f;
    TrackingNotchBank bank;
    MeterReader tracked{"HUM_FREQUENCY"};

    void Update(const zen::EditorLink& link, CurveDisplay& display) {
        if (link.GetSampleRate() != rate) {
            rate = link.GetSampleRate();
            bank.Prepare(rate, 1);
        }
        bank.SetParameter(TrackingNotchBank::kHarmonics, link.GetParameter(ZenHumRemoval::kHarmonics));
        bank.SetParameter(TrackingNotchBank::kWidth, link.GetParameter(ZenHumRemoval::kWidth));
        const int mains = static_cast<int>(std::lround(link.GetParameter(ZenHumRemoval::kFrequency)));
        const double nominal = mains == ZenHumRemoval::k60Hz ? 60.0 : 50.0;
        const double fundamental = tracked.Read(link).value_or(static_cast<float>(nominal));
        const double amount = link.GetParameter(ZenHumRemoval::kAmount) / 100.0;
        const bool listen = link.GetParameter(ZenHumRemoval::kListen) >= 0.5f;
        // The harmonics themselves too, so each null is drawn at its true depth.
        std::vector<double> frequencies = display.Plot().SamplePositions(kResponsePoints);
        const auto harmonics = static_cast<int>(std::lround(link.GetParameter(ZenHumRemoval::kHarmonics)));
        for (int k = 1; k <= harmonics; ++k) frequencies.push_back(k * fundamental);
        std::sort(frequencies.begin(), frequencies.end());
        std::vector<QPointF> points;
        for (double f : frequencies) {
            const std::complex<double> hum = amount * bank.HumTransfer(f, fundamental);
            const double magnitude = std::abs(listen ? hum : 1.0 - hum);
            points.emplace_back(f, magnitude > 0.0 ? 20.0 * std::log10(magnitude) : kFloorDb);
        }
        display.SetCurve(0, std::move(points), QString("Notches on %1 Hz").arg(fundamental, 0, 'f', 2));
    }
};

void BuildHumRemovalEditor(ZenEditor& editor) {
    auto comb = std::make_shared<Comb>();
    auto response = new CurveDisplay(
        "Notches", [comb](const zen::EditorLink& link, CurveDisplay& display) { comb->Update(link, display); });
    response->Plot().SetHorizontal(20.0, 2000.0, PlotArea::Scale::Logarithmic, "Hz");
    response->Plot().SetVertical(kFloorDb, 6.0, "dB");
    editor.AddDisplay(response, 2);

    auto tracked = std::make_shared<MeterReader>("HUM_FREQUENCY");
    auto history = new HistoryDisplay(
        "Tracked Fundamental", 49.0, 61.0, "Hz", kHistorySeconds,
        [tracked](const zen::EditorLink& link) { return std::vector<float>{tracked->Read(link).value_or(50.0f)}; });
    history->SetTraceNames({"Fundamental"});
    editor.AddDisplay(history, 1);

    editor.AddGroup("Hum", {"FREQUENCY", "TRACKING"});
    editor.AddGroup("Notches", {"HARMONICS", "WIDTH"});
    editor.AddGroup("Output", {"AMOUNT", "LISTEN"});
    editor.AddMeters("Hum", {"HUM_FREQUENCY", "HUM_LEVEL"});
    editor.AddMeters("Output", {"OUTPUT_PEAK"});
}

const EditorLayoutRegistry::Entry kLayout("ZenHumRemoval", &BuildHumRemovalEditor);

}  // namespace
