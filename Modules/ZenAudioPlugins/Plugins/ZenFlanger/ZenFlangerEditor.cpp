// The editor of "Flanger": the LFO as it runs, the sweep and the mix.
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/LfoDisplay.h"
#include "Common/Editor/ZenEditor.h"

namespace {

void BuildFlangerEditor(ZenEditor& editor) {
    if (LfoDisplay* lfo = LfoDisplay::Create(editor, QObject::tr("LFO"))) editor.AddDisplay(lfo, 2);
    editor.AddGroup(QObject::tr("Sweep"), {"MANUAL", "DEPTH", "FEEDBACK", "SPREAD"});
    editor.AddGroup(QObject::tr("LFO"), {"SHAPE", "RATE", "SYNC", "TEMPO"});
    editor.AddGroup(QObject::tr("Output"), {"MIX"});
    editor.AddMeters(QObject::tr("Output"), {"OUTPUT_PEAK"});
}

const EditorLayoutRegistry::Entry kLayout("ZenFlanger", &BuildFlangerEditor);

}  // namespace
