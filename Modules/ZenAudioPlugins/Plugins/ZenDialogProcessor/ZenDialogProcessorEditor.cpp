// Editor of "Dialogue Processor": the rumble high-pass as the strip designs
// it, the expander's and compressor's static curves at the amounts' settings
// with the operating point of the stage that acts, and the stage meters.
#include <memory>

#include "Common/Algorithms/ButterworthHighPass.h"
#include "Common/Algorithms/EnvelopeCoefficients.h"
#include "Common/Algorithms/Expander.h"
#include "Common/Algorithms/RmsCompressor.h"
#include "Common/Editor/CurveDisplay.h"
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/FilterResponse.h"
#include "Common/Editor/MeterReader.h"
#include "Common/Editor/TransferCurve.h"
#include "Common/Editor/ZenEditor.h"
#include "ZenDialogProcessor.h"

namespace {

using D = ZenDialogProcessor;

constexpr int kResponsePoints = 200;
constexpr int kTransferPoints = 121;
constexpr double kLowestLevelDb = -80.0;

bool On(const zen::EditorLink& link, D::Parameter p) { return link.GetParameter(p) > 0.5f; }

struct Rumble {
    float rate = 0.0f;
    ButterworthHighPass highPass;

    void Update(const zen::EditorLink& link, CurveDisplay& display) {
        if (link.GetSampleRate() != rate) {
            rate = link.GetSampleRate();
            highPass.Prepare(rate, 1);
            highPass.SetParameter(ButterworthHighPass::kSlope, ButterworthHighPass::kTwentyFourDb);
        }
        FilterResponse response(rate);
        if (On(link, D::kRumbleFilter)) {
            highPass.SetParameter(ButterworthHighPass::kFrequency, link.GetParameter(D::kRumbleFrequency));
            for (int s = 0; s < highPass.SectionCount(); ++s) response.Add(highPass.SectionCoefficients(s));
        }
        display.SetCurve(0, response.Curve(display.Plot().SamplePositions(kResponsePoints)), "Rumble Filter");
    }
};

// The two gain stages set as the strip's control map and ConfigureStages set them.
struct Dynamics {
    Expander expander;
    RmsCompressor compressor;
    MeterReader expanderGain{"EXPANDER_REDUCTION"};
    MeterReader compressorGain{"COMPRESSOR_REDUCTION"};

    Dynamics() {
        expander.Prepare(48000.0f, 1);
        expander.SetParameter(Expander::kRatio, D::kExpanderRatio);
        compressor.Prepare(48000.0f, 1);
        compressor.SetParameter(RmsCompressor::kKnee, D::kCompressorKneeDb);
        compressor.SetParameter(RmsCompressor::kMakeupReference, D::kCompressorMakeupReferenceDb);
        compressor.SetParameter(RmsCompressor::kAutoMakeup, 1.0f);
    }

    void Update(const zen::EditorLink& link, CurveDisplay& display) {
        const std::vector<double> inputs = display.Plot().SamplePositions(kTransferPoints);
        const bool expanderOn = On(link, D::kExpander);
        expander.SetParameter(Expander::kThreshold, link.GetParameter(D::kExpanderThreshold));
        expander.SetParameter(Expander::kRange, D::kExpanderRangeAtOneDb * link.GetParameter(D::kExpanderAmount));
        TransferCurve::Law expand = [&](double x) {
            return expanderOn ? zen::LogUnitsToDb(expander.GainAt(zen::DbToLogUnits(static_cast<float>(x)))) : 0.0;
        };
        display.SetCurve(0, TransferCurve::Points(expand, inputs), "Expander");

        const bool compressorOn = On(link, D::kCompressor);
        const float amount = link.GetParameter(D::kCompressorAmount);
        compressor.SetParameter(RmsCompressor::kThreshold,
                                D::kCompressorThresholdAtZeroDb - D::kCompressorThresholdSpanDb * amount);
        compressor.SetParameter(RmsCompressor::kRatio, D::kCompressorRatioAtZero + D::kCompressorRatioSpan * amount);
        TransferCurve::Law compress = [&](double x) {
            return compressorOn ? zen::LogUnitsToDb(compressor.GainReduction(zen::DbToLogUnits(static_cast<float>(x))))
                                : 0.0;
        };
        const double makeup = compressorOn ? zen::LogUnitsToDb(compressor.GetMakeup()) : 0.0;
        display.SetCurve(1, TransferCurve::Points(compress, inputs, makeup), "Compressor");

        std::optional<QPointF> marker;
        const std::optional<float> compressed = compressorGain.Read(link);
        const std::optional<float> expanded = expanderGain.Read(link);
        if (compressorOn && compressed && *compressed < -TransferCurve::kGainTolerance)
            marker = TransferCurve::OperatingPoint(compress, *compressed, kLowestLevelDb, 0.0, makeup);
        else if (expanderOn && expanded && *expanded < -TransferCurve::kGainTolerance)
            marker = TransferCurve::OperatingPoint(expand, *expanded, kLowestLevelDb, 0.0);
        display.SetMarker(marker);
    }
};

void BuildDialogProcessorEditor(ZenEditor& editor) {
    auto rumble = std::make_shared<Rumble>();
    auto response = new CurveDisplay("Rumble Filter", [rumble](const zen::EditorLink& link, CurveDisplay& display) {
        rumble->Update(link, display);
    });
    response->Plot().SetHorizontal(20.0, 2000.0, PlotArea::Scale::Logarithmic, "Hz");
    response->Plot().SetVertical(-48.0, 6.0, "dB");
    editor.AddDisplay(response, 1);

    auto dynamics = std::make_shared<Dynamics>();
    auto transfer = new CurveDisplay(
        "Expander and Compressor",
        [dynamics](const zen::EditorLink& link, CurveDisplay& display) { dynamics->Update(link, display); });
    transfer->Plot().SetHorizontal(kLowestLevelDb, 0.0, PlotArea::Scale::Linear, "dB in");
    transfer->Plot().SetVertical(kLowestLevelDb, 0.0, "dB out");
    editor.AddDisplay(transfer, 1);

    editor.AddGroup("Rumble Filter", {"RUMBLE_FILT", "RUMBLE_FREQ"});
    editor.AddGroup("De-Pop", {"DEPOP", "DEPOP_AMOUNT"});
    editor.AddGroup("De-Esser", {"DEESS", "DEESS_AMOUNT", "DEESS_FREQ"});
    editor.AddGroup("Expander", {"EXPANDER", "EXP_AMOUNT", "EXP_THRESHOLD", "EXP_SPEED"});
    editor.AddGroup("Compressor", {"COMPRESSOR", "COMP_AMOUNT"});
    editor.AddGroup("Exciter", {"EXCITER", "EXCITER_AMOUNT"});
    editor.AddGroup("Output", {"OUTPUT_GAIN"});
    editor.AddMeters("Input", {"INPUT_PEAK"});
    editor.AddMeters("Stages", {"RUMBLE_REMOVED", "DEPOP_REDUCTION", "DEESS_REDUCTION", "EXPANDER_REDUCTION",
                                "COMPRESSOR_REDUCTION", "EXCITER_ADDED"});
    editor.AddMeters("Output", {"OUTPUT_PEAK"});
}

const EditorLayoutRegistry::Entry kLayout("ZenDialogProcessor", &BuildDialogProcessorEditor);

}  // namespace
