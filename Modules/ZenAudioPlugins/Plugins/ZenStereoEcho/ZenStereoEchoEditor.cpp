// Editor of "Echo": the feedback path's fixed low cut and its "Tone" high
// cut as the path designs them, alone and with the feedback gain a repeat
// passes, and the echo time in force (set or synced to the tempo).
#include <cmath>
#include <memory>

#include "Common/Algorithms/FeedbackPath.h"
#include "Common/Editor/CurveDisplay.h"
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/FilterResponse.h"
#include "Common/Editor/ZenEditor.h"
#include "Common/WorkingValues.h"
#include "ZenStereoEcho.h"

namespace {

constexpr int kResponsePoints = 200;

struct Path {
    float rate = 0.0f;
    FeedbackPath path;

    void Update(const zen::EditorLink& link, CurveDisplay& display) {
        if (link.GetSampleRate() != rate) {
            rate = link.GetSampleRate();
            path.Prepare(rate, 1);
        }
        path.SetCuts(ZenStereoEcho::kLowCut, link.GetParameter(ZenStereoEcho::kTone));
        FilterResponse cuts(rate);
        cuts.Add(path.LowCutCoefficients()).Add(path.HighCutCoefficients());
        const std::vector<double> frequencies = display.Plot().SamplePositions(kResponsePoints);
        display.SetCurve(0, cuts.Curve(frequencies), "Cuts");

        const double time =
            ZenStereoEcho::TimeMs(link.GetParameter(ZenStereoEcho::kTime),
                                  static_cast<int>(std::lround(link.GetParameter(ZenStereoEcho::kSync))),
                                  link.GetParameter(ZenStereoEcho::kTempo));
        const float feedback = zen::working::PercentToFraction(link.GetParameter(ZenStereoEcho::kFeedback));
        if (feedback > 0.0f) cuts.AddGainDb(20.0 * std::log10(feedback));
        display.SetCurve(1, feedback > 0.0f ? cuts.Curve(frequencies) : std::vector<QPointF>{},
                         QString("Per repeat (%1 ms)").arg(time, 0, 'f', 1));
    }
};

void BuildStereoEchoEditor(ZenEditor& editor) {
    auto path = std::make_shared<Path>();
    auto response = new CurveDisplay(
        "Feedback Path", [path](const zen::EditorLink& link, CurveDisplay& display) { path->Update(link, display); });
    response->Plot().SetHorizontal(20.0, 20000.0, PlotArea::Scale::Logarithmic, "Hz");
    response->Plot().SetVertical(-36.0, 6.0, "dB");
    editor.AddDisplay(response);
    editor.AddGroup("Time", {"TIME", "SYNC", "TEMPO"});
    editor.AddGroup("Feedback", {"FEEDBACK", "DRIVE", "TONE"});
    editor.AddGroup("Tape", {"WOW", "FLUTTER"});
    editor.AddGroup("Output", {"MIX"});
    editor.AddMeters("Output", {"OUTPUT_PEAK"});
}

const EditorLayoutRegistry::Entry kLayout("ZenStereoEcho", &BuildStereoEchoEditor);

}  // namespace
