// Editor of "Vocal Channel": the low cut and EQ drawn from the designs the
// strip runs, the gate's and compressor's static curves with the
// compressor's operating point, and the stage meters.
#include <memory>

#include "Common/Algorithms/ButterworthHighPass.h"
#include "Common/Algorithms/EnvelopeCoefficients.h"
#include "Common/Algorithms/RmsCompressor.h"
#include "Common/Algorithms/ThreeBandEq.h"
#include "Common/Editor/CurveDisplay.h"
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/FilterResponse.h"
#include "Common/Editor/MeterReader.h"
#include "Common/Editor/TransferCurve.h"
#include "Common/Editor/ZenEditor.h"
#include "ZenVocalChannel.h"

namespace {

constexpr int kResponsePoints = 200;
constexpr int kTransferPoints = 121;
constexpr double kResponseRangeDb = 24.0;
constexpr double kLowestLevelDb = -72.0;

using P = ZenVocalChannel::Parameter;

bool On(const zen::EditorLink& link, P p) { return link.GetParameter(p) > 0.5f; }

// The strip's filters, designed on the editor's side from the parameters as
// the strip's control map and switches set them.
struct Filters {
    float rate = 0.0f;
    ButterworthHighPass lowCut;
    ThreeBandEq eq;

    FilterResponse Response(const zen::EditorLink& link) {
        if (link.GetSampleRate() != rate) {
            rate = link.GetSampleRate();
            lowCut.Prepare(rate, 1);
            eq.Prepare(rate, 1);
        }
        FilterResponse response(rate);
        if (On(link, P::kLowCut)) {
            lowCut.SetParameter(ButterworthHighPass::kFrequency, link.GetParameter(P::kLowCutFrequency));
            lowCut.SetParameter(ButterworthHighPass::kSlope, link.GetParameter(P::kLowCutSlope));
            for (int s = 0; s < lowCut.SectionCount(); ++s) response.Add(lowCut.SectionCoefficients(s));
        }
        const struct {
            P parameter;
            ThreeBandEq::Parameter target;
        } bands[] = {{P::kLowGain, ThreeBandEq::kLowGain},
                     {P::kLowFrequency, ThreeBandEq::kLowFrequency},
                     {P::kMidGain, ThreeBandEq::kMidGain},
                     {P::kMidFrequency, ThreeBandEq::kMidFrequency},
                     {P::kMidQ, ThreeBandEq::kMidQ},
                     {P::kHighGain, ThreeBandEq::kHighGain},
                     {P::kHighFrequency, ThreeBandEq::kHighFrequency}};
        for (const auto& b : bands) eq.SetParameter(b.target, link.GetParameter(b.parameter));
        for (int band = 0; band < 3; ++band) response.Add(eq.BandCoefficients(band));
        return response;
    }
};

struct Dynamics {
    RmsCompressor compressor;
    MeterReader reduction{"COMP_REDUCTION"};

    Dynamics() {
        compressor.Prepare(48000.0f, 1);
        compressor.SetParameter(RmsCompressor::kKnee, ZenVocalChannel::kCompressorKneeDb);
    }
    void Update(const zen::EditorLink& link, CurveDisplay& display) {
        const std::vector<double> inputs = display.Plot().SamplePositions(kTransferPoints);
        const float gateThreshold = link.GetParameter(P::kGateThreshold);
        const float gateRange = link.GetParameter(P::kGateRange);
        const bool gateOn = On(link, P::kGate);
        TransferCurve::Law gate = [&](double x) { return gateOn && x < gateThreshold ? -gateRange : 0.0; };
        display.SetCurve(0, TransferCurve::Points(gate, inputs), "Gate");

        compressor.SetParameter(RmsCompressor::kThreshold, link.GetParameter(P::kCompressorThreshold));
        compressor.SetParameter(RmsCompressor::kRatio, link.GetParameter(P::kCompressorRatio));
        compressor.SetParameter(RmsCompressor::kMakeup, link.GetParameter(P::kCompressorMakeup));
        const bool compressorOn = On(link, P::kCompressor);
        TransferCurve::Law law = [&](double x) {
            return compressorOn ? zen::LogUnitsToDb(compressor.GainReduction(zen::DbToLogUnits(static_cast<float>(x))))
                                : 0.0;
        };
        const double makeup = compressorOn ? zen::LogUnitsToDb(compressor.GetMakeup()) : 0.0;
        display.SetCurve(1, TransferCurve::Points(law, inputs, makeup), "Compressor");
        const std::optional<float> gain = reduction.Read(link);
        display.SetMarker(compressorOn && gain ? TransferCurve::OperatingPoint(law, *gain, kLowestLevelDb, 0.0, makeup)
                                               : std::nullopt);
    }
};

void BuildVocalChannelEditor(ZenEditor& editor) {
    auto filters = std::make_shared<Filters>();
    auto response = new CurveDisplay("Low Cut and EQ", [filters](const zen::EditorLink& link, CurveDisplay& display) {
        const FilterResponse r = filters->Response(link);
        display.SetCurve(0, r.Curve(display.Plot().SamplePositions(kResponsePoints)), "Response");
    });
    response->Plot().SetHorizontal(20.0, 20000.0, PlotArea::Scale::Logarithmic, "Hz");
    response->Plot().SetVertical(-kResponseRangeDb, kResponseRangeDb, "dB");
    editor.AddDisplay(response, 2);

    auto dynamics = std::make_shared<Dynamics>();
    auto transfer = new CurveDisplay(
        "Gate and Compressor",
        [dynamics](const zen::EditorLink& link, CurveDisplay& display) { dynamics->Update(link, display); });
    transfer->Plot().SetHorizontal(kLowestLevelDb, 0.0, PlotArea::Scale::Linear, "dB in");
    transfer->Plot().SetVertical(kLowestLevelDb, 0.0, "dB out");
    editor.AddDisplay(transfer, 1);

    editor.AddGroup("Low Cut", {"LOW_CUT", "LOW_CUT_FREQ", "LOW_CUT_SLOPE"});
    editor.AddGroup("Gate", {"GATE", "GATE_THRESHOLD", "GATE_RANGE", "GATE_HOLD", "GATE_RELEASE"});
    editor.AddGroup("EQ", {"LOW_GAIN", "LOW_FREQ", "MID_GAIN", "MID_FREQ", "MID_Q", "HIGH_GAIN", "HIGH_FREQ"});
    editor.AddGroup("Compressor",
                    {"COMPRESSOR", "COMP_THRESHOLD", "COMP_RATIO", "COMP_ATTACK", "COMP_RELEASE", "COMP_MAKEUP"});
    editor.AddGroup("De-Esser", {"DEESS", "DEESS_FREQ", "DEESS_AMOUNT"});
    editor.AddGroup("Output", {"OUTPUT_GAIN"});
    editor.AddMeters("Input", {"INPUT_PEAK"});
    editor.AddMeters("Stages", {"LOW_CUT_REMOVED", "GATE_GAIN", "EQ_PEAK", "COMP_REDUCTION", "DEESS_REDUCTION"});
    editor.AddMeters("Output", {"OUTPUT_PEAK"});
}

const EditorLayoutRegistry::Entry kLayout("ZenVocalChannel", &BuildVocalChannelEditor);

}  // namespace
