// The editor of "Surround Analyzer": the image (direction, spread), the
// programme loudness, the front pairs' correlations and per-channel bars.
#include <string>
#include <vector>

#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/ReadoutDisplay.h"
#include "Common/Editor/SurroundImageDisplay.h"
#include "Common/Editor/ZenEditor.h"

namespace {

void AddReadout(ZenEditor& editor, const QString& caption, const char* meter, int decimals) {
    const int index = editor.FindMeter(meter);
    if (index >= 0) editor.AddDisplay(ReadoutDisplay::ForMeter(caption, static_cast<std::uint32_t>(index), decimals), 0);
}

void BuildSurroundAnalyzerEditor(ZenEditor& editor) {
    const int direction = editor.FindMeter("DIRECTION"), spread = editor.FindMeter("SPREAD");
    std::vector<std::uint32_t> levels;
    for (int n = 1, index; (index = editor.FindMeter(("LEVEL_" + std::to_string(n)).c_str())) >= 0; ++n)
        levels.push_back(static_cast<std::uint32_t>(index));
    if (direction >= 0 && spread >= 0)
        editor.AddDisplay(new SurroundImageDisplay(QObject::tr("Image"), static_cast<std::uint32_t>(direction),
                                                   static_cast<std::uint32_t>(spread), std::move(levels)),
                          2);
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
