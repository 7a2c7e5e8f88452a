// Editor of "Delay": the feedback path's low and high cut as the path
// designs them, alone and with the feedback gain a repeat passes, and the
// delay times in force (set or synced to the tempo).
#include <cmath>
#include <memory>

#include "Common/Algorithms/FeedbackPath.h"
#include "Common/Editor/CurveDisplay.h"
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/FilterResponse.h"
#include "Common/Editor/ZenEditor.h"
#include "Common/WorkingValues.h"
#include "ZenStereoDelay.h"

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
        path.SetCuts(link.GetParameter(ZenStereoDelay::kLowCut), link.GetParameter(ZenStereoDelay::kHighCut));
        FilterResponse cuts(rate);
        cuts.Add(path.LowCutCoefficients()).Add(path.HighCutCoefficients());
        const std::vector<double> frequencies = display.Plot().SamplePositions(kResponsePoints);
        display.SetCurve(0, cuts.Curve(frequencies), "Cuts");

        const float tempo = link.GetParameter(ZenStereoDelay::kTempo);
        const double left = ZenStereoDelay::SideTimeMs(link.GetParameter(ZenStereoDelay::kTimeL),
                                                       link.GetParameter(ZenStereoDelay::kSyncL), tempo);
        const double right = link.GetParameter(ZenStereoDelay::kLink) >= 0.5f
                                 ? left
                                 : ZenStereoDelay::SideTimeMs(link.GetParameter(ZenStereoDelay::kTimeR),
                                                              link.GetParameter(ZenStereoDelay::kSyncR), tempo);
        const float feedback = zen::working::PercentToFraction(link.GetParameter(ZenStereoDelay::kFeedback));
        if (feedback > 0.0f) cuts.AddGainDb(20.0 * std::log10(feedback));
        display.SetCurve(1, feedback > 0.0f ? cuts.Curve(frequencies) : std::vector<QPointF>{},
                         QString("Per repeat (L %1 ms, R %2 ms)").arg(left, 0, 'f', 1).arg(right, 0, 'f', 1));
    }
};

void BuildStereoDelayEditor(ZenEditor& editor) {
    auto path = std::make_shared<Path>();
    auto response = new CurveDisplay(
        "Feedback Path", [path](const zen::EditorLink& link, CurveDisplay& display) { path->Update(link, display); });
    response->Plot().SetHorizontal(20.0, 20000.0, PlotArea::Scale::Logarithmic, "Hz");
    response->Plot().SetVertical(-36.0, 6.0, "dB");
    editor.AddDisplay(response);
    editor.AddGroup("Time", {"TIME_L", "TIME_R", "LINK", "SYNC_L", "SYNC_R", "TEMPO"});
    editor.AddGroup("Feedback", {"FEEDBACK", "PING_PONG", "LOW_CUT", "HIGH_CUT"});
    editor.AddGroup("Output", {"MIX"});
    editor.AddMeters("Output", {"OUTPUT_PEAK"});
}

const EditorLayoutRegistry::Entry kLayout("ZenStereoDelay", &BuildStereoDelayEditor);

}  // namespace
