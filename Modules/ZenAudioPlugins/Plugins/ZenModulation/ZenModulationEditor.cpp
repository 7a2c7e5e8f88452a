// The editor of "Modulation": the LFO as it runs, the effect, its phaser
// stages and the mix.
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/LfoDisplay.h"
#include "Common/Editor/ZenEditor.h"

namespace {

void BuildModulationEditor(ZenEditor& editor) {
    if (LfoDisplay* lfo = LfoDisplay::Create(editor, QObject::tr("LFO"))) editor.AddDisplay(lfo, 2);
    editor.AddGroup(QObject::tr("Effect"), {"MODE", "DEPTH", "SPREAD"});
    editor.AddGroup(QObject::tr("LFO"), {"SHAPE", "RATE", "SYNC", "TEMPO"});
    editor.AddGroup(QObject::tr("Phaser"), {"FREQUENCY", "STAGES", "FEEDBACK"});
    editor.AddGroup(QObject::tr("Output"), {"MIX"});
    editor.AddMeters(QObject::tr("Output"), {"OUTPUT_PEAK"});
}

const EditorLayoutRegistry::Entry kLayout("ZenModulation", &BuildModulationEditor);

}  // namespace
