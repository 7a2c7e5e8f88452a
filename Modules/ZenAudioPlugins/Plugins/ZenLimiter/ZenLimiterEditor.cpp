// Editor of "Limiter": gain reduction over time, and the input true peak
// and output peak over time against the ceiling.
#include <memory>

#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/HistoryDisplay.h"
#include "Common/Editor/MeterReader.h"
#include "Common/Editor/ZenEditor.h"
#include "ZenLimiter.h"

namespace {

constexpr double kHistorySeconds = 10.0;
constexpr double kHighestLevelDb = 6.0;

void BuildLimiterEditor(ZenEditor& editor) {
    auto reduction = std::make_shared<MeterReader>("GAIN_REDUCTION");
    auto history = new HistoryDisplay(
        "Gain Reduction", ZenLimiter::kGainMeterFloorDb, 0.0, "dB", kHistorySeconds,
        [reduction](const zen::EditorLink& link) { return std::vector<float>{reduction->Read(link).value_or(0.0f)}; });
    history->SetTraceNames({"Gain"});
    editor.AddDisplay(history);

    auto input = std::make_shared<MeterReader>("INPUT_TRUE_PEAK");
    auto output = std::make_shared<MeterReader>("OUTPUT_PEAK");
    auto levels = new HistoryDisplay("Levels", ZenLimiter::kLevelMeterFloorDb, kHighestLevelDb, "dB", kHistorySeconds,
                                     [input, output](const zen::EditorLink& link) {
                                         const float floor = ZenLimiter::kLevelMeterFloorDb;
                                         return std::vector<float>{input->Read(link).value_or(floor),
                                                                   output->Read(link).value_or(floor),
                                                                   link.GetParameter(ZenLimiter::kCeiling)};
                                     });
    levels->SetTraceNames({"Input True Peak", "Output Peak", "Ceiling"});
    editor.AddDisplay(levels);

    editor.AddGroup("Input", {"INPUT_GAIN"});
    editor.AddGroup("Limiter", {"THRESHOLD", "RELEASE", "SOFT"});
    editor.AddMeters("Input", {"INPUT_TRUE_PEAK"});
    editor.AddMeters("Gain Reduction", {"GAIN_REDUCTION"});
    editor.AddMeters("Output", {"OUTPUT_PEAK"});
}

const EditorLayoutRegistry::Entry kLayout("ZenLimiter", &BuildLimiterEditor);

}  // namespace
