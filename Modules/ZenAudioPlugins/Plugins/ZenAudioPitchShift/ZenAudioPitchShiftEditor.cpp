// The editor of "Pitch": the total shift in large type, the shift, the mix
// and the engine's settings.
#include <cmath>

#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/ReadoutDisplay.h"
#include "Common/Editor/ZenEditor.h"

namespace {

constexpr double kCentsPerSemitone = 100.0;

void BuildPitchEditor(ZenEditor& editor) {
    const int coarse = editor.FindParameter("COARSE");
    const int fine = editor.FindParameter("FINE");
    if (coarse >= 0 && fine >= 0) {
        editor.AddDisplay(new ReadoutDisplay(QObject::tr("Total Shift"),
                                             [=](const zen::EditorLink& link) {
                                                 const double semitones =
                                                     link.GetParameter(static_cast<std::uint32_t>(coarse)) +
                                                     link.GetParameter(static_cast<std::uint32_t>(fine)) / kCentsPerSemitone;
                                                 const double ratio = std::exp2(semitones / 12.0);
                                                 return QString::asprintf("%+.2f st  (×%.3f)", semitones, ratio);
                                             }),
                          1);
    }
    editor.AddGroup(QObject::tr("Shift"), {"COARSE", "FINE"});
    editor.AddGroup(QObject::tr("Mix"), {"DRY_WET"});
    editor.AddGroup(QObject::tr("Engine"), {"JOINT_ON", "ALGO_TYPE", "ALGO_MODE"});
    editor.AddGroup(QObject::tr("Peak Picking"), {"LOG10_EPS_PEAK", "MAX_PEAK", "LOG10_TOL"});
}

const EditorLayoutRegistry::Entry kLayout("ZenAudioPitchShift", &BuildPitchEditor);

}  // namespace
