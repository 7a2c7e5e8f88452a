// Editor of "Stereo Width": what mid and side pass at each frequency (with
// mono bass, the side keeps only the crossover's upper band, as the
// plug-in's crossover designs it), and the output's correlation over time.
#include <cmath>
#include <memory>

#include "Common/Algorithms/LinkwitzRileyCrossover.h"
#include "Common/Editor/CurveDisplay.h"
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/FilterResponse.h"
#include "Common/Editor/HistoryDisplay.h"
#include "Common/Editor/MeterReader.h"
#include "Common/Editor/ZenEditor.h"
#include "ZenStereoWidth.h"

namespace {

constexpr int kResponsePoints = 200;
constexpr double kHistorySeconds = 10.0;
// Drawn for a side taken out entirely (width 0 %): below any plot.
constexpr double kSilentDb = -300.0;

struct MidSide {
    float rate = 0.0f;
    LinkwitzRileyCrossover crossover;

    void Update(const zen::EditorLink& link, CurveDisplay& display) {
        if (link.GetSampleRate() != rate) {
            rate = link.GetSampleRate();
            crossover.Prepare(rate, 1);
            crossover.SetParameter(LinkwitzRileyCrossover::kBands, 2.0f);
        }
        crossover.SetParameter(LinkwitzRileyCrossover::kFrequency1,
                               link.GetParameter(ZenStereoWidth::kMonoBassFrequency));
        const bool monoBass = link.GetParameter(ZenStereoWidth::kMonoBass) >= 0.5f;
        const double width = link.GetParameter(ZenStereoWidth::kWidth) / 100.0;
        const FilterResponse low = FilterResponse::CrossoverBand(crossover, 0);
        const FilterResponse high = FilterResponse::CrossoverBand(crossover, 1);
        std::vector<QPointF> midPoints, sidePoints;
        for (double f : display.Plot().SamplePositions(kResponsePoints)) {
            // Mid passes both bands (their sum), side the upper one only.
            const double midMagnitude = monoBass ? std::abs(low.At(f) + high.At(f)) : 1.0;
            const double sideMagnitude = width * (monoBass ? std::abs(high.At(f)) : 1.0);
            midPoints.emplace_back(f, 20.0 * std::log10(midMagnitude));
            sidePoints.emplace_back(f, sideMagnitude > 0.0 ? 20.0 * std::log10(sideMagnitude) : kSilentDb);
        }
        display.SetCurve(0, std::move(midPoints), "Mid");
        display.SetCurve(1, std::move(sidePoints), "Side");
    }
};

void BuildStereoWidthEditor(ZenEditor& editor) {
    auto midSide = std::make_shared<MidSide>();
    auto response = new CurveDisplay("Mid and Side", [midSide](const zen::EditorLink& link, CurveDisplay& display) {
        midSide->Update(link, display);
    });
    response->Plot().SetHorizontal(20.0, 20000.0, PlotArea::Scale::Logarithmic, "Hz");
    response->Plot().SetVertical(-36.0, 12.0, "dB");
    editor.AddDisplay(response, 2);

    auto correlation = std::make_shared<MeterReader>("CORRELATION");
    auto history =
        new HistoryDisplay("Correlation", -1.0, 1.0, "", kHistorySeconds, [correlation](const zen::EditorLink& link) {
            return std::vector<float>{correlation->Read(link).value_or(0.0f)};
        });
    history->SetTraceNames({"Correlation"});
    editor.AddDisplay(history, 1);

    editor.AddGroup("Width", {"WIDTH"});
    editor.AddGroup("Mono Bass", {"MONO_BASS", "MONO_BASS_FREQUENCY"});
    editor.AddMeters("Correlation", {"CORRELATION"});
}

const EditorLayoutRegistry::Entry kLayout("ZenStereoWidth", &BuildStereoWidthEditor);

}  // namespace
