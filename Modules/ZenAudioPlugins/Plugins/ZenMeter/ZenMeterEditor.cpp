// The editor of "Meter": the loudness history, the programme readings and
// every channel's bars.
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/HistoryDisplay.h"
#include "Common/Editor/ReadoutDisplay.h"
#include "Common/Editor/ZenEditor.h"

namespace {

constexpr double kHistorySeconds = 60.0;
constexpr double kLowLufs = -59.0;  // the meters' display range, the EBU +18 scale
constexpr double kHighLufs = -5.0;

void BuildMeterEditor(ZenEditor& editor) {
    const int momentary = editor.FindMeter("MOMENTARY");
    const int shortTerm = editor.FindMeter("SHORT_TERM");
    const int integrated = editor.FindMeter("INTEGRATED");
    const int range = editor.FindMeter("LOUDNESS_RANGE");
    const int maxTruePeak = editor.FindMeter("MAX_TRUE_PEAK");
    if (momentary >= 0 && shortTerm >= 0 && integrated >= 0) {
        auto* history = new HistoryDisplay(
            QObject::tr("Loudness"), kLowLufs, kHighLufs, "LUFS", kHistorySeconds,
            [=](const zen::EditorLink& link) {
                return std::vector<float>{link.GetMeter(static_cast<std::uint32_t>(momentary)),
                                          link.GetMeter(static_cast<std::uint32_t>(shortTerm)),
                                          link.GetMeter(static_cast<std::uint32_t>(integrated))};
            });
        history->SetTraceNames({QObject::tr("Momentary"), QObject::tr("Short-Term"), QObject::tr("Integrated")});
        editor.AddDisplay(history, 3);
        editor.AddDisplay(ReadoutDisplay::ForMeter(QObject::tr("Integrated"), static_cast<std::uint32_t>(integrated), 1), 0);
    }
    if (range >= 0)
        editor.AddDisplay(ReadoutDisplay::ForMeter(QObject::tr("Loudness Range"), static_cast<std::uint32_t>(range), 1), 0);
    if (maxTruePeak >= 0)
        editor.AddDisplay(ReadoutDisplay::ForMeter(QObject::tr("Max True Peak"), static_cast<std::uint32_t>(maxTruePeak), 1), 0);

    editor.AddMeters(QObject::tr("Loudness"), {"MOMENTARY", "SHORT_TERM", "INTEGRATED", "MAX_MOMENTARY", "MAX_SHORT_TERM"});
    editor.AddMeters(QObject::tr("True Peak"), {"TRUE_PEAK"});
    editor.AddMeters(QObject::tr("Sample Peak"), {"SAMPLE_PEAK"});
    editor.AddMeters(QObject::tr("RMS"), {"RMS"});
    editor.AddGroup(QObject::tr("Scale"), {"SCALE", "TRUE_PEAK"});
    editor.AddGroup(QObject::tr("Channels"), {"LFE_CHANNEL"});
    editor.AddGroup(QObject::tr("Measurement"), {"RESET"});
}

const EditorLayoutRegistry::Entry kLayout("ZenMeter", &BuildMeterEditor);

}  // namespace
