// Editor of "AI": the applied gain and the output peak over time, drained
// from the plug-in's gain history, with the speech loudness going in; the
// template's controls (only those of the template in effect are shown); the
// levelling switches and ranges; the gain and speech meters.
#include <QWidget>
#include <array>
#include <memory>
#include <string>
#include <vector>

#include "CacheEffect.h"
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/HistoryDisplay.h"
#include "Common/Editor/MeterReader.h"
#include "Common/Editor/ParameterControl.h"
#include "Common/Editor/ZenEditor.h"
#include "ZenAudioIntelligence.h"

namespace {

constexpr double kHistorySeconds = 20.0;
constexpr double kLowestDb = -30.0;
constexpr double kHighestDb = 30.0;
constexpr std::uint32_t kReadChunk = 64;

// The newest record of the gain history, read with a cursor of its own.
struct GainHistory {
    int ring = -1;
    std::uint64_t cursor = 0;
    CacheEffect::Record newest{};
    std::array<float, kReadChunk * CacheEffect::kRecordWidth> buffer{};

    std::vector<float> Read(const zen::EditorLink& link, MeterReader& speech) {
        if (ring >= 0) {
            for (;;) {
                const zen::MeterRingRead read =
                    link.ReadMeterRing(static_cast<std::uint32_t>(ring), cursor, buffer.data(), kReadChunk);
                if (read.records == 0) break;
                std::copy_n(buffer.begin() + (read.records - 1) * CacheEffect::kRecordWidth, CacheEffect::kRecordWidth,
                            newest.begin());
            }
        }
        return {newest[CacheEffect::kGain] / 10.0f, newest[CacheEffect::kPeak] / 10.0f,
                speech.Read(link).value_or(ZenAudioIntelligence::kSpeechMeterFloor)};
    }
};

void BuildAudioIntelligenceEditor(ZenEditor& editor) {
    auto history = std::make_shared<GainHistory>();
    history->ring = editor.FindMeter("GAIN_HISTORY");
    auto speech = std::make_shared<MeterReader>("SPEECH_IN");
    auto display = new HistoryDisplay("Gain List", kLowestDb, kHighestDb, "dB", kHistorySeconds,
                                      [history, speech](const zen::EditorLink& link) {
                                          return history->Read(link, *speech);
                                      });
    display->SetTraceNames({"Gain", "Output Peak", "Speech In"});
    editor.AddDisplay(display);

    // Every template's controls in one group; a refresh shows those of the
    // template in effect.
    std::vector<std::string> controls = {"TEMPLATE"};
    for (std::uint32_t i = ZenAudioIntelligence::kLevellingMode; i < ZenAudioIntelligence::kEngineFirst; ++i) {
        zen::ParameterInfo info;
        editor.Link().GetParameterInfo(i, info);
        controls.push_back(info.identifier.substr(info.identifier.find("::") + 2));
    }
    editor.AddGroup("Template", controls);
    editor.AddGroup("Levelling", {"LEVELLING", "APPLY_GAIN_LIST", "TARGET_OFFSET", "MAX_BOOST", "MAX_CUT",
                                  "ATTACK", "RELEASE", "MAX_GAIN_RATE"});
    editor.AddMeters("Levels", {"GAIN", "SPEECH_IN", "SPEECH_OUT", "OUTPUT_PEAK"});

    auto shown = std::make_shared<int>(-2);
    ZenEditor* e = &editor;
    editor.OnRefresh([e, shown] {
        const zen::EditorLink& link = e->Link();
        const int number = static_cast<int>(link.GetParameter(ZenAudioIntelligence::kTemplate) + 0.5f);
        if (number == *shown) return;
        *shown = number;
        const std::vector<const char*> wanted = ZenAudioIntelligence::ControlsOf(number);
        for (std::uint32_t i = ZenAudioIntelligence::kLevellingMode; i < ZenAudioIntelligence::kParameterCount; ++i) {
            ParameterControl* control = e->Control(i);
            if (control == nullptr || e->GroupOf(i) != "Template") continue;
            bool visible = false;
            for (const char* name : wanted) visible = visible || e->FindParameter(name) == static_cast<int>(i);
            control->setVisible(visible);
        }
    });
}

const EditorLayoutRegistry::Entry kLayout("ZenAudioIntelligence", &BuildAudioIntelligenceEditor);

}  // namespace
