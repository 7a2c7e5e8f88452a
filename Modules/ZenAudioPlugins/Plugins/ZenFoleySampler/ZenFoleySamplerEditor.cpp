// The editor of "Foley Sampler": the pads to play, the sound of the next
// press and the voices.
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/ZenEditor.h"
#include "FoleyPadGrid.h"

namespace {

void BuildFoleySamplerEditor(ZenEditor& editor) {
    const int pad = editor.FindParameter("PAD"), trigger = editor.FindParameter("TRIGGER");
    const int pads = editor.FindMeter("PADS"), voices = editor.FindMeter("ACTIVE_VOICES");
    if (pad >= 0 && trigger >= 0 && pads >= 0 && voices >= 0)
        editor.AddDisplay(new FoleyPadGrid(editor.Link(), static_cast<std::uint32_t>(pad),
                                           static_cast<std::uint32_t>(trigger), static_cast<std::uint32_t>(pads),
                                           static_cast<std::uint32_t>(voices)),
                          3);
    editor.AddGroup(QObject::tr("Pad"), {"PAD", "TRIGGER"});
    editor.AddGroup(QObject::tr("Sound"), {"PITCH", "GAIN", "VARIATION"});
    editor.AddGroup(QObject::tr("Voices"), {"VOICES"});
    editor.AddMeters(QObject::tr("Output"), {"OUTPUT_PEAK"});
}

const EditorLayoutRegistry::Entry kLayout("ZenFoleySampler", &BuildFoleySamplerEditor);

}  // namespace
