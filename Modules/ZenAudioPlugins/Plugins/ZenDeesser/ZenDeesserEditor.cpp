// Editor of "De-Esser": the detector's band (the boost its side chain
// compares against the input) as the algorithm designs it, and the
// reduction over time.
#include <memory>

#include "Common/Algorithms/Deesser.h"
#include "Common/Editor/CurveDisplay.h"
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/FilterResponse.h"
#include "Common/Editor/HistoryDisplay.h"
#include "Common/Editor/MeterReader.h"
#include "Common/Editor/ZenEditor.h"
#include "ZenDeesser.h"

namespace {

constexpr int kResponsePoints = 200;
constexpr double kHistorySeconds = 5.0;
// The band's boost reaches 16.7 dB; the reduction meter reads down to -18 dB.
constexpr double kBandRangeDb = 18.0;

struct Band {
    float rate = 0.0f;
    Deesser deesser;

    void Update(const zen::EditorLink& link, CurveDisplay& display) {
        if (link.GetSampleRate() != rate) {
            rate = link.GetSampleRate();
            deesser.Prepare(rate, 1);
        }
        deesser.SetParameter(Deesser::kRange, link.GetParameter(ZenDeesser::kFrequency));
        deesser.SetParameter(Deesser::kMode, link.GetParameter(ZenDeesser::kMode));
        deesser.SetParameter(Deesser::kAmount, link.GetParameter(ZenDeesser::kAmount));
        FilterResponse response(rate);
        response.Add(deesser.Control().BandCoefficients());
        display.SetCurve(0, response.Curve(display.Plot().SamplePositions(kResponsePoints)), "Detector Band");
    }
};

void BuildDeesserEditor(ZenEditor& editor) {
    auto band = std::make_shared<Band>();
    auto response = new CurveDisplay(
        "Detector", [band](const zen::EditorLink& link, CurveDisplay& display) { band->Update(link, display); });
    response->Plot().SetHorizontal(200.0, 20000.0, PlotArea::Scale::Logarithmic, "Hz");
    response->Plot().SetVertical(-6.0, kBandRangeDb, "dB");
    editor.AddDisplay(response);

    auto reduction = std::make_shared<MeterReader>("REDUCTION");
    auto history = new HistoryDisplay(
        "Reduction", -kBandRangeDb, 0.0, "dB", kHistorySeconds,
        [reduction](const zen::EditorLink& link) { return std::vector<float>{reduction->Read(link).value_or(0.0f)}; });
    history->SetTraceNames({"Reduction"});
    editor.AddDisplay(history);

    editor.AddGroup("Detector", {"RANGE", "MODE"});
    editor.AddGroup("Reduction", {"AMOUNT"});
    editor.AddGroup("Monitor", {"ESS_ONLY"});
    editor.AddMeters("Reduction", {"REDUCTION"});
    editor.AddMeters("Output", {"OUTPUT"});
}

const EditorLayoutRegistry::Entry kLayout("ZenDeesser", &BuildDeesserEditor);

}  // namespace
