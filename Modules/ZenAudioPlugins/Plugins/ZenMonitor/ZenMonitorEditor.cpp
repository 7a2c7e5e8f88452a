// The editor of "Monitor": the channel sounding now in large type, the
// test signal and where it goes.
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/ReadoutDisplay.h"
#include "Common/Editor/ZenEditor.h"
#include "ZenMonitor.h"

namespace {

void BuildMonitorEditor(ZenEditor& editor) {
    const int channel = editor.FindMeter("CHANNEL");
    const int output = editor.FindParameter("OUTPUT");
    if (channel >= 0 && output >= 0)
        editor.AddDisplay(
            new ReadoutDisplay(QObject::tr("Active Channel"),
                               [channel, output](const zen::EditorLink& link) {
                                   // 0: every channel, or a chosen one the instance does not have.
                                   const int sounding = qRound(link.GetMeter(static_cast<std::uint32_t>(channel)));
                                   if (sounding > 0) return QString::number(sounding);
                                   return qRound(link.GetParameter(static_cast<std::uint32_t>(output))) == ZenMonitor::kAll
                                              ? QObject::tr("All")
                                              : QObject::tr("None");
                               }),
            1);
    editor.AddMeters(QObject::tr("Output"), {"PEAK"});
    editor.AddGroup(QObject::tr("Signal"), {"SIGNAL", "FREQUENCY", "LEVEL"});
    editor.AddGroup(QObject::tr("Routing"), {"OUTPUT", "WALK_TIME"});
}

const EditorLayoutRegistry::Entry kLayout("ZenMonitor", &BuildMonitorEditor);

}  // namespace
