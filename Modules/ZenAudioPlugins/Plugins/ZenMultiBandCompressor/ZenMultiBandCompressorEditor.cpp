// Editor of "Multiband Compressor": the crossover's band responses as the
// plug-in's crossover designs them, each band's static curve with the
// operating point of the band that reduces most, and per-band gain
// reduction bars.
#include <memory>
#include <string>

#include "Common/Algorithms/EnvelopeCoefficients.h"
#include "Common/Algorithms/LinkwitzRileyCrossover.h"
#include "Common/Algorithms/SoftKneeCompressor.h"
#include "Common/Editor/CurveDisplay.h"
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/FilterResponse.h"
#include "Common/Editor/MeterReader.h"
#include "Common/Editor/TransferCurve.h"
#include "Common/Editor/ZenEditor.h"
#include "ZenMultiBandCompressor.h"

namespace {

using Plugin = ZenMultiBandCompressor;

constexpr int kResponsePoints = 200;
constexpr int kTransferPoints = 121;
constexpr double kLowestLevelDb = -72.0;
constexpr double kHighestLevelDb = 6.0;

std::uint32_t Bands(const zen::EditorLink& link) {
    return static_cast<std::uint32_t>(
        std::clamp(std::lround(link.GetParameter(Plugin::kBands)), 1L, static_cast<long>(Plugin::kMaxBands)));
}

QString BandName(std::uint32_t band) { return QString("Band %1").arg(band + 1); }

struct Crossover {
    float rate = 0.0f;
    LinkwitzRileyCrossover crossover;

    void Update(const zen::EditorLink& link, CurveDisplay& display) {
        if (link.GetSampleRate() != rate) {
            rate = link.GetSampleRate();
            crossover.Prepare(rate, 1);
        }
        crossover.SetParameter(LinkwitzRileyCrossover::kBands, static_cast<float>(Bands(link)));
        for (std::uint32_t s = 0; s < Plugin::kMaxSplits; ++s)
            crossover.SetParameter(LinkwitzRileyCrossover::kFrequency1 + s, link.GetParameter(Plugin::kCrossover1 + s));
        const std::vector<double> frequencies = display.Plot().SamplePositions(kResponsePoints);
        for (std::uint32_t b = 0; b < Plugin::kMaxBands; ++b) {
            if (b < crossover.GetBandCount())
                display.SetCurve(b, FilterResponse::CrossoverBand(crossover, b).Curve(frequencies), BandName(b));
            else
                display.SetCurve(b, {});
        }
    }
};

struct Laws {
    std::vector<MeterReader> reductions;

    Laws() {
        for (std::uint32_t b = 0; b < Plugin::kMaxBands; ++b)
            reductions.emplace_back("GAIN_REDUCTION_" + std::to_string(b + 1));
    }

    void Update(const zen::EditorLink& link, CurveDisplay& display) {
        const std::vector<double> inputs = display.Plot().SamplePositions(kTransferPoints);
        const std::uint32_t bands = Bands(link);
        std::optional<QPointF> marker;
        float deepest = -TransferCurve::kGainTolerance;
        for (std::uint32_t b = 0; b < Plugin::kMaxBands; ++b) {
            if (b >= bands) {
                display.SetCurve(b, {});
                continue;
            }
            auto value = [&](Plugin::BandParameter p) { return link.GetParameter(Plugin::Index(b, p)); };
            const bool bypassed = value(Plugin::kBypass) > 0.5f;
            const SoftKneeCompressor::Law law{zen::DbToLogUnits(value(Plugin::kThreshold)),
                                              SoftKneeCompressor::SlopeOfRatio(value(Plugin::kRatio)),
                                              zen::DbToLogUnits(value(Plugin::kKnee)), 0.0f};
            TransferCurve::Law gain = [&](double x) {
                return bypassed ? 0.0
                                : zen::LogUnitsToDb(
                                      SoftKneeCompressor::Reduction(zen::DbToLogUnits(static_cast<float>(x)), law));
            };
            const double makeup = bypassed ? 0.0 : value(Plugin::kMakeup);
            // Unnamed: the colours are the crossover display's, whose legend names the bands.
            display.SetCurve(b, TransferCurve::Points(gain, inputs, makeup));
            const std::optional<float> reduction = reductions[b].Read(link);
            if (reduction && *reduction < deepest) {
                deepest = *reduction;
                marker = TransferCurve::OperatingPoint(gain, *reduction, kLowestLevelDb, kHighestLevelDb, makeup);
            }
        }
        display.SetMarker(marker);
    }
};

void BuildMultiBandCompressorEditor(ZenEditor& editor) {
    auto crossover = std::make_shared<Crossover>();
    auto bands = new CurveDisplay("Crossover", [crossover](const zen::EditorLink& link, CurveDisplay& display) {
        crossover->Update(link, display);
    });
    bands->Plot().SetHorizontal(20.0, 20000.0, PlotArea::Scale::Logarithmic, "Hz");
    bands->Plot().SetVertical(-36.0, 6.0, "dB");
    editor.AddDisplay(bands, 2);

    auto laws = std::make_shared<Laws>();
    auto transfer = new CurveDisplay(
        "Band Curves", [laws](const zen::EditorLink& link, CurveDisplay& display) { laws->Update(link, display); });
    transfer->Plot().SetHorizontal(kLowestLevelDb, kHighestLevelDb, PlotArea::Scale::Linear, "dB in");
    transfer->Plot().SetVertical(kLowestLevelDb, kHighestLevelDb, "dB out");
    editor.AddDisplay(transfer, 1);

    editor.AddGroup("Crossover", {"BANDS", "CROSSOVER_1", "CROSSOVER_2", "CROSSOVER_3", "CROSSOVER_4"});
    editor.AddGroup("Band 1",
                    {"THRESHOLD_1", "RATIO_1", "ATTACK_1", "RELEASE_1", "KNEE_1", "MAKEUP_1", "SOLO_1", "BYPASS_1"});
    editor.AddGroup("Band 2",
                    {"THRESHOLD_2", "RATIO_2", "ATTACK_2", "RELEASE_2", "KNEE_2", "MAKEUP_2", "SOLO_2", "BYPASS_2"});
    editor.AddGroup("Band 3",
                    {"THRESHOLD_3", "RATIO_3", "ATTACK_3", "RELEASE_3", "KNEE_3", "MAKEUP_3", "SOLO_3", "BYPASS_3"});
    editor.AddGroup("Band 4",
                    {"THRESHOLD_4", "RATIO_4", "ATTACK_4", "RELEASE_4", "KNEE_4", "MAKEUP_4", "SOLO_4", "BYPASS_4"});
    editor.AddGroup("Band 5",
                    {"THRESHOLD_5", "RATIO_5", "ATTACK_5", "RELEASE_5", "KNEE_5", "MAKEUP_5", "SOLO_5", "BYPASS_5"});
    editor.AddGroup("Detector", {"SIDECHAIN", "LOOKAHEAD"});
    editor.AddGroup("Output", {"OUTPUT"});
    editor.AddMeters("Gain Reduction", {"GAIN_REDUCTION_1", "GAIN_REDUCTION_2", "GAIN_REDUCTION_3", "GAIN_REDUCTION_4",
                                        "GAIN_REDUCTION_5"});
    editor.AddMeters("Levels", {"INPUT_PEAK", "OUTPUT_PEAK"});
}

const EditorLayoutRegistry::Entry kLayout("ZenMultiBandCompressor", &BuildMultiBandCompressorEditor);

}  // namespace
