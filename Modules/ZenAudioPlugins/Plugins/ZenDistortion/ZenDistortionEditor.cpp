// Editor of "Distortion": the static curve of the chosen saturation at the
// live drive, ceiling and output level with the loudest input peak on it,
// and the wet path's tone (DC blocker and tilt) as a frequency response.
#include <cmath>
#include <memory>

#include "Common/Algorithms/Waveshaper.h"
#include "Common/Decibels.h"
#include "Common/Editor/CurveDisplay.h"
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/FilterResponse.h"
#include "Common/Editor/MeterReader.h"
#include "Common/Editor/ZenEditor.h"
#include "ZenDistortion.h"

namespace {

constexpr int kCurvePoints = 241;
constexpr int kResponsePoints = 200;
constexpr double kInputSpan = 1.0;    // full scale either side
constexpr double kOutputSpan = 1.25;  // room for a raised output level

struct Shape {
    MeterReader input{"INPUT_PEAK"};

    void Update(const zen::EditorLink& link, CurveDisplay& display) {
        const auto curve = static_cast<Waveshaper::Curve>(std::lround(link.GetParameter(ZenDistortion::kCurve)));
        const double ceiling = zen::DbToGain(link.GetParameter(ZenDistortion::kCeiling));
        const double pre = zen::DbToGain(link.GetParameter(ZenDistortion::kDrive)) / ceiling;
        const double level = zen::DbToGain(link.GetParameter(ZenDistortion::kOutputLevel));
        auto transfer = [&](double x) { return level * ceiling * Waveshaper::Apply(curve, pre * x); };
        std::vector<QPointF> points;
        for (double x : display.Plot().SamplePositions(kCurvePoints)) points.emplace_back(x, transfer(x));
        display.SetCurve(0, std::move(points), "Curve");
        const std::optional<float> peakDb = input.Read(link);
        const double peak = peakDb ? zen::DbToGain(*peakDb) : 0.0;
        display.SetMarker(peak > 1e-3 && peak <= kInputSpan ? std::optional<QPointF>(QPointF(peak, transfer(peak)))
                                                            : std::nullopt);
    }
};

// The wet path's filters run sample by sample in the plug-in; here as
// sections: the DC blocker (1 - z^-1) / (1 - p z^-1), then the tilt
// t + (1/t - t) L with L = a / (1 - (1 - a) z^-1) its one-pole low-pass.
FilterResponse ToneResponse(float toneDb, double rate) {
    const double p = ZenDistortion::DcPole(rate);
    const double a = ZenDistortion::ToneCoefficient(rate);
    const double t = ZenDistortion::TiltGain(toneDb);
    FilterResponse response(rate);
    response.Add(FilterResponse::Raw(1.0, -1.0, 0.0, 1.0, -p, 0.0));
    response.Add(FilterResponse::Raw(t + (1.0 / t - t) * a, -t * (1.0 - a), 0.0, 1.0, -(1.0 - a), 0.0));
    return response;
}

void BuildDistortionEditor(ZenEditor& editor) {
    auto shape = std::make_shared<Shape>();
    auto curve = new CurveDisplay(
        "Curve", [shape](const zen::EditorLink& link, CurveDisplay& display) { shape->Update(link, display); });
    curve->Plot().SetHorizontal(-kInputSpan, kInputSpan, PlotArea::Scale::Linear, "in");
    curve->Plot().SetVertical(-kOutputSpan, kOutputSpan, "out");
    editor.AddDisplay(curve);

    auto tone = new CurveDisplay("Tone", [](const zen::EditorLink& link, CurveDisplay& display) {
        const FilterResponse r = ToneResponse(link.GetParameter(ZenDistortion::kTone), link.GetSampleRate());
        display.SetCurve(0, r.Curve(display.Plot().SamplePositions(kResponsePoints)), "Tone");
    });
    tone->Plot().SetHorizontal(20.0, 20000.0, PlotArea::Scale::Logarithmic, "Hz");
    tone->Plot().SetVertical(-12.0, 12.0, "dB");
    editor.AddDisplay(tone);

    editor.AddGroup("Drive", {"DRIVE", "CURVE", "CEILING"});
    editor.AddGroup("Tone", {"TONE"});
    editor.AddGroup("Output", {"MIX", "OUTPUT_LEVEL"});
    editor.AddMeters("Levels", {"INPUT_PEAK", "SATURATION", "OUTPUT_PEAK"});
}

const EditorLayoutRegistry::Entry kLayout("ZenDistortion", &BuildDistortionEditor);

}  // namespace
