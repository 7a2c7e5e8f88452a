// Editor of "Soft Clipper": the static curve of Clip at the live threshold,
// shape and output level, with the loudest input peak and the output peak
// it gave as the operating point.
#include <cmath>
#include <memory>

#include "Common/Decibels.h"
#include "Common/Editor/CurveDisplay.h"
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/MeterReader.h"
#include "Common/Editor/ZenEditor.h"
#include "ZenSoftClipper.h"

namespace {

constexpr int kTransferPoints = 241;
constexpr double kLowestLevelDb = -36.0;
constexpr double kHighestLevelDb = 6.0;

struct Transfer {
    MeterReader input{"INPUT_PEAK"};
    MeterReader output{"OUTPUT_PEAK"};

    void Update(const zen::EditorLink& link, CurveDisplay& display) {
        // As the processing does: drive above 0 dB, a lower knee below.
        const float t = zen::DbToGainFloored(link.GetParameter(ZenSoftClipper::kThreshold));
        const float s = link.GetParameter(ZenSoftClipper::kShape);
        const float gain = zen::DbToGain(link.GetParameter(ZenSoftClipper::kOutputGain));
        const float drive = t > 1.0f ? t : 1.0f;
        const float knee = std::min(1.0f, t);
        std::vector<QPointF> points;
        for (double x : display.Plot().SamplePositions(kTransferPoints)) {
            const float y = gain * ZenSoftClipper::Clip(drive * zen::DbToGain(x), knee, s);
            points.emplace_back(x, zen::GainToMeterDb(std::fabs(y)));
        }
        display.SetCurve(0, std::move(points), "Curve");
        const std::optional<float> in = input.Read(link), out = output.Read(link);
        const bool signal = in && out && *in > kLowestLevelDb;
        display.SetMarker(signal ? std::optional<QPointF>(QPointF(*in, *out)) : std::nullopt);
    }
};

void BuildSoftClipperEditor(ZenEditor& editor) {
    auto transfer = std::make_shared<Transfer>();
    auto display = new CurveDisplay(
        "Transfer", [transfer](const zen::EditorLink& link, CurveDisplay& d) { transfer->Update(link, d); });
    display->Plot().SetHorizontal(kLowestLevelDb, kHighestLevelDb, PlotArea::Scale::Linear, "dBFS in");
    display->Plot().SetVertical(kLowestLevelDb, kHighestLevelDb, "dBFS out");
    editor.AddDisplay(display);
    editor.AddGroup("Clipper", {"THRESHOLD", "SHAPE"});
    editor.AddGroup("Output", {"OUTPUT_GAIN"});
    editor.AddMeters("Levels", {"INPUT_PEAK", "CLIPPING", "OUTPUT_PEAK"});
}

const EditorLayoutRegistry::Entry kLayout("ZenSoftClipper", &BuildSoftClipperEditor);

}  // namespace
