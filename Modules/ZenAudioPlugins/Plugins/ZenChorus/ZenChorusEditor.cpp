// The editor of "Chorus": the LFO as it runs, the voices and the mix.
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/LfoDisplay.h"
#include "Common/Editor/ZenEditor.h"

namespace {

void BuildChorusEditor(ZenEditor& editor) {
    if (LfoDisplay* lfo = LfoDisplay::Create(editor, QObject::tr("LFO"))) editor.AddDisplay(lfo, 2);
    editor.AddGroup(QObject::tr("Voices"), {"VOICES", "DELAY", "DEPTH", "SPREAD"});
    editor.AddGroup(QObject::tr("LFO"), {"SHAPE", "RATE", "SYNC", "TEMPO"});
    editor.AddGroup(QObject::tr("Output"), {"MIX"});
    editor.AddMeters(QObject::tr("Output"), {"OUTPUT_PEAK"});
}

const EditorLayoutRegistry::Entry kLayout("ZenChorus", &BuildChorusEditor);

}  // namespace
