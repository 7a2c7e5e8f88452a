// The editor of "Voice Isolation": how sure the detector is of a voice over
// the last seconds, the gain applied across frequency and the reduction.
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/HistoryDisplay.h"
#include "Common/Editor/SpectrumDisplay.h"
#include "Common/Editor/ZenEditor.h"

namespace {

constexpr double kHistorySeconds = 10.0;
constexpr double kGainLowDb = -60.0;
constexpr double kGainHighDb = 0.0;

void BuildVoiceIsolationEditor(ZenEditor& editor) {
    const int voice = editor.FindMeter("VOICE");
    const int reduction = editor.FindMeter("REDUCTION_1");
    const int gain = editor.FindMeter("GAIN_SPECTRUM");
    if (voice >= 0) {
        auto* history = new HistoryDisplay(QObject::tr("Voice"), 0.0, 100.0, "%", kHistorySeconds,
                                           [voice](const zen::EditorLink& link) {
                                               return std::vector<float>{link.GetMeter(static_cast<std::uint32_t>(voice))};
                                           });
        history->SetTraceNames({QObject::tr("Voice")});
        editor.AddDisplay(history, 2);
    }
    if (reduction >= 0) {
        auto* history = new HistoryDisplay(QObject::tr("Reduction"), kGainLowDb, kGainHighDb, "dB", kHistorySeconds,
                                           [reduction](const zen::EditorLink& link) {
                                               return std::vector<float>{link.GetMeter(static_cast<std::uint32_t>(reduction))};
                                           });
        history->SetTraceNames({QObject::tr("Reduction")});
        editor.AddDisplay(history, 2);
    }
    if (gain >= 0)
        editor.AddDisplay(new SpectrumDisplay(QObject::tr("Gain"), kGainLowDb, kGainHighDb,
                                              {{QObject::tr("Gain"), static_cast<std::uint32_t>(gain),
                                                SpectrumDisplay::Source::Array}}),
                          2);
    editor.AddMeters(QObject::tr("Reduction"), {"REDUCTION"});
    editor.AddGroup(QObject::tr("Isolation"), {"AMOUNT", "BACKGROUND"});
}

const EditorLayoutRegistry::Entry kLayout("ZenVoiceIsolationControl", &BuildVoiceIsolationEditor);

}  // namespace
