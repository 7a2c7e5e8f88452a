// The editor of "Surround Analyzer": the image (direction, spread), the
// programme loudness, the front pairs' correlations and per-channel bars.
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/ReadoutDisplay.h"
#include "Common/Editor/ZenEditor.h"

namespace {

void AddReadout(ZenEditor& editor, const QString& caption, const char* meter, int decimals) {
    const int index = editor.FindMeter(meter);
    if (index >= 0) editor.AddDisplay(ReadoutDisplay::ForMeter(caption, static_cast<std::uint32_t>(index), decimals), 0);
}

void BuildSurroundAnalyzerEditor(ZenEditor& editor) {
    AddReadout(editor, QObject::tr("Loudness"), "LOUDNESS", 1);
    AddReadout(editor, QObject::tr("Direction"), "DIRECTION", 0);
    AddReadout(editor, QObject::tr("Spread"), "SPREAD", 0);
    AddReadout(editor, QObject::tr("Correlation L/R"), "CORRELATION_LR", 2);
    AddReadout(editor, QObject::tr("Correlation L/C"), "CORRELATION_LC", 2);
    AddReadout(editor, QObject::tr("Correlation C/R"), "CORRELATION_CR", 2);
    editor.AddMeters(QObject::tr("Level"), {"LEVEL"});
    editor.AddMeters(QObject::tr("Loudness"), {"CHANNEL_LOUDNESS"});
    editor.AddMeters(QObject::tr("Share"), {"SHARE"});
    editor.AddGroup(QObject::tr("Analysis"), {"LFE_CHANNEL", "TIME"});
}

const EditorLayoutRegistry::Entry kLayout("ZenPlumeFish", &BuildSurroundAnalyzerEditor);

}  // namespace
