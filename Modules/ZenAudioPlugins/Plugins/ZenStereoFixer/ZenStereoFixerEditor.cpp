// The editor of "Stereo Fixer": what it measured (the offset it aligns, the
// output's correlation and balance, whether it folds to mono) and the fixes.
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/ReadoutDisplay.h"
#include "Common/Editor/ZenEditor.h"

namespace {

void BuildStereoFixerEditor(ZenEditor& editor) {
    const int offset = editor.FindMeter("OFFSET");
    const int correlation = editor.FindMeter("OUTPUT_CORRELATION");
    const int balance = editor.FindMeter("OUTPUT_BALANCE");
    const int folded = editor.FindMeter("FOLDED");
    if (offset >= 0) editor.AddDisplay(ReadoutDisplay::ForMeter(QObject::tr("Offset"), static_cast<std::uint32_t>(offset), 2), 1);
    if (correlation >= 0)
        editor.AddDisplay(ReadoutDisplay::ForMeter(QObject::tr("Correlation"), static_cast<std::uint32_t>(correlation), 2), 1);
    if (balance >= 0)
        editor.AddDisplay(ReadoutDisplay::ForMeter(QObject::tr("Balance"), static_cast<std::uint32_t>(balance), 1), 1);
    if (folded >= 0)
        editor.AddDisplay(ReadoutDisplay::ForState(QObject::tr("Fold-Down"), static_cast<std::uint32_t>(folded),
                                                   QObject::tr("Stereo"), QObject::tr("Mono")),
                          1);
    editor.AddGroup(QObject::tr("Channels"), {"SWAP", "LEFT_POLARITY", "RIGHT_POLARITY"});
    editor.AddGroup(QObject::tr("Alignment"), {"AUTO_ALIGN", "BALANCE"});
    editor.AddGroup(QObject::tr("Mono"), {"FOLD_DOWN"});
}

const EditorLayoutRegistry::Entry kLayout("ZenStereoFixer", &BuildStereoFixerEditor);

}  // namespace
