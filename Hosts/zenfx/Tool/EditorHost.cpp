#include "EditorHost.h"

#include <QApplication>
#include <QBuffer>
#include <QImage>
#include <QPixmap>
#include <QScrollArea>
#include <QTimer>
#include <QWidget>
#include <cstdlib>

#include "HostCore/Settings/AtomicFile.h"
#include "ZenfxError.h"

namespace zenfx {

namespace {

// In device-independent pixels: a large screen.
const QSize kLargestPicture(1920, 1600);

// QApplication keeps a reference to argc and reads argv for its lifetime.
int g_argc = 1;
char g_name[] = "zenfx";
char* g_argv[] = {g_name, nullptr};

// What the toolkit says about the machine rather than the editor (no
// runtime folder, a platform without window-manager hints) stays out of the
// command's output; everything else is passed on.
QtMessageHandler g_nextHandler = nullptr;

void FilterMessages(QtMsgType type, const QMessageLogContext& context, const QString& message) {
    if (type == QtDebugMsg || type == QtInfoMsg) return;
    if (message.contains(QLatin1String("XDG_RUNTIME_DIR")) || message.contains(QLatin1String("propagateSizeHints")))
        return;
    if (g_nextHandler != nullptr) g_nextHandler(type, context, message);
}

zen::PluginParameters* ParametersOf(zen::PluginInstance& instance) {
    if (auto* audio = zen::InterfaceCast<AudioPlugin>(&instance)) return audio;
    return zen::InterfaceCast<ControlPlugin>(&instance);
}

}  // namespace

EditorHost::EditorHost(bool offscreen, int scale) {
    if (scale != 1 && scale != 2) throw ZenfxError("--scale must be 1 or 2", kExitUsage);
    if (offscreen) {
        const char* platform = std::getenv("QT_QPA_PLATFORM");
        // Qt 5's offscreen platform leaves its screen behind when the
        // application ends; the minimal one with fonts draws the same.
        if (platform == nullptr || *platform == '\0') setenv("QT_QPA_PLATFORM", "minimal:enable_fonts", 1);
        // Scaling from the screen's density would make pictures differ by machine.
        setenv("QT_SCALE_FACTOR", scale == 2 ? "2" : "1", 1);
        unsetenv("QT_AUTO_SCREEN_SCALE_FACTOR");
        unsetenv("QT_SCREEN_SCALE_FACTORS");
    } else {
        // Qt aborts the process when it finds no display; say so instead.
        const char* platform = std::getenv("QT_QPA_PLATFORM");
        const bool named = platform != nullptr && *platform != '\0';
        if (!named && std::getenv("DISPLAY") == nullptr && std::getenv("WAYLAND_DISPLAY") == nullptr)
            throw ZenfxError("no display to show the editor on (DISPLAY is not set); zenfx screenshot needs none");
        if (scale == 2) setenv("QT_SCALE_FACTOR", "2", 1);
    }
    g_nextHandler = qInstallMessageHandler(FilterMessages);
    m_application = std::make_unique<QApplication>(g_argc, g_argv);
}

EditorHost::~EditorHost() = default;

std::unique_ptr<QWidget> EditorHost::CreateEditor(zen::PluginInstance& instance) {
    zen::PluginParameters* parameters = ParametersOf(instance);
    std::unique_ptr<QWidget> editor(parameters ? static_cast<QWidget*>(parameters->CreateEditor(nullptr)) : nullptr);
    if (!editor) throw ZenfxError(std::string("'") + instance.GetName() + "' has no editor");
    editor->setWindowTitle(QString::fromStdString(instance.GetName()));
    return editor;
}

void EditorHost::HoldClock(QWidget& editor) {
    // Showing starts the clock; it is stopped before any event could run it.
    if (!editor.isVisible()) editor.show();
    for (QTimer* clock : editor.findChildren<QTimer*>()) clock->stop();
    QApplication::processEvents();
}

void EditorHost::Refresh(QWidget& editor) {
    for (QTimer* clock : editor.findChildren<QTimer*>()) {
        clock->stop();
        QMetaObject::invokeMethod(clock, "timeout", Qt::DirectConnection);
    }
}

void EditorHost::Settle(QWidget& editor) {
    QApplication::processEvents();
    // The editor's own size hint, not adjustSize's two thirds of a screen:
    // the virtual screens of offscreen rendering are small.
    editor.resize(editor.sizeHint().boundedTo(kLargestPicture));
    QApplication::processEvents();
    // A picture shows every control: the window grows by what its scroll
    // areas hide, up to a screen's worth.
    for (int pass = 0; pass < 2; ++pass) {
        QSize grow(0, 0);
        for (QScrollArea* area : editor.findChildren<QScrollArea*>()) {
            if (area->widget() == nullptr || !area->isVisible()) continue;
            const QSize hidden = area->widget()->sizeHint() - area->viewport()->size();
            grow = grow.expandedTo(hidden);
        }
        if (grow.width() <= 0 && grow.height() <= 0) break;
        editor.resize((editor.size() + grow.expandedTo(QSize(0, 0))).boundedTo(kLargestPicture));
        QApplication::processEvents();
    }
}

QSize EditorHost::WritePng(QWidget& editor, const std::string& path) {
    const QImage image = editor.grab().toImage();
    QByteArray png;
    QBuffer buffer(&png);
    buffer.open(QIODevice::WriteOnly);
    if (image.isNull() || !image.save(&buffer, "PNG")) throw ZenfxError("cannot render the editor as PNG");
    zen::host::AtomicFile file(path);
    file.Write(std::string(png.constData(), static_cast<std::size_t>(png.size())));
    file.Commit();
    return image.size();
}

int EditorHost::Run() { return QApplication::exec(); }

}  // namespace zenfx
