// The editor of "Frequency Analyzer": the first row's spectrum with its held
// peaks, and the analysis settings.
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/SpectrumDisplay.h"
#include "Common/Editor/ZenEditor.h"

namespace {

constexpr double kLowDb = -120.0;
constexpr double kHighDb = 6.0;

void BuildFrequencyEditor(ZenEditor& editor) {
    // The first row: channel 1, or the sum when "Channels" is "Summed".
    const int spectrum = editor.FindMeter("SPECTRUM_1");
    if (spectrum >= 0) {
        const auto meter = static_cast<std::uint32_t>(spectrum);
        editor.AddDisplay(new SpectrumDisplay(QObject::tr("Spectrum"), kLowDb, kHighDb,
                                              {{QObject::tr("Average"), meter, SpectrumDisplay::Source::RingPower},
                                               {QObject::tr("Peak"), meter, SpectrumDisplay::Source::RingPeak}}),
                          3);
    }
    editor.AddGroup(QObject::tr("Analysis"), {"SIZE", "WINDOW", "MODE"});
    editor.AddGroup(QObject::tr("Ballistics"), {"AVERAGE", "DECAY"});
}

const EditorLayoutRegistry::Entry kLayout("ZenFrequency", &BuildFrequencyEditor);

}  // namespace
