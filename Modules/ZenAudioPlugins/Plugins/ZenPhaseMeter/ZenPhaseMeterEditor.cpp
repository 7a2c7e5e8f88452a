// The editor of "Phase Meter": the goniometer with its correlation bar, and
// the mid, side, balance and correlation readings.
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/GoniometerDisplay.h"
#include "Common/Editor/ReadoutDisplay.h"
#include "Common/Editor/ZenEditor.h"

namespace {

void BuildPhaseMeterEditor(ZenEditor& editor) {
    const int points = editor.FindMeter("GONIOMETER");
    const int correlation = editor.FindMeter("CORRELATION");
    const int overall = editor.FindMeter("OVERALL_CORRELATION");
    const int balance = editor.FindMeter("BALANCE");
    if (points >= 0)
        editor.AddDisplay(new GoniometerDisplay(QObject::tr("Goniometer"), static_cast<std::uint32_t>(points), correlation), 3);
    if (overall >= 0)
        editor.AddDisplay(ReadoutDisplay::ForMeter(QObject::tr("Overall Correlation"), static_cast<std::uint32_t>(overall), 2), 0);
    if (balance >= 0)
        editor.AddDisplay(ReadoutDisplay::ForMeter(QObject::tr("Balance"), static_cast<std::uint32_t>(balance), 2), 0);
    editor.AddMeters(QObject::tr("Mid / Side"), {"MID", "SIDE"});
    editor.AddGroup(QObject::tr("Integration"), {"TIME"});
}

const EditorLayoutRegistry::Entry kLayout("ZenPhaseMeter", &BuildPhaseMeterEditor);

}  // namespace
