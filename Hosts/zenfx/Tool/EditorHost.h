// The toolkit side of the commands that show a plug-in's editor: the
// application object, the editor widget from the plug-in itself, refreshes on
// demand and the picture of it.
#pragma once

#include <QSize>
#include <memory>
#include <string>

#include "zen/Zen.h"

class QApplication;
class QWidget;

namespace zenfx {

class EditorHost {
public:
    // Creates the application. `offscreen`: no display needed (Qt's minimal
    // platform with fonts, unless QT_QPA_PLATFORM names one). `scale` 1 or 2 sets
    // QT_SCALE_FACTOR, so a picture at 2 has twice the pixels of one at 1.
    EditorHost(bool offscreen, int scale);
    ~EditorHost();
    EditorHost(const EditorHost&) = delete;
    EditorHost& operator=(const EditorHost&) = delete;

    // The editor of an audio or control plug-in as a window of its own,
    // titled with the plug-in's name. Delete it before the instance. Throws
    // ZenfxError when the plug-in builds none.
    static std::unique_ptr<QWidget> CreateEditor(zen::PluginInstance& instance);

    // Shows the editor with its clock stopped: from then on it refreshes
    // only on Refresh, so a picture depends on what was processed and not on
    // when it was taken.
    static void HoldClock(QWidget& editor);
    // One refresh, as the editor's clock does it.
    static void Refresh(QWidget& editor);
    // Lays out and paints what the refreshes left, at the editor's preferred size.
    static void Settle(QWidget& editor);

    // The editor as a PNG, replacing `path` atomically; the picture's size
    // in pixels. Throws ZenfxError or HostError.
    static QSize WritePng(QWidget& editor, const std::string& path);

    // The event loop, until the last window closes.
    int Run();

private:
    std::unique_ptr<QApplication> m_application;
};

}  // namespace zenfx
