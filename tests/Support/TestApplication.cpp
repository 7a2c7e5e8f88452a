#include "TestApplication.h"

#include <QApplication>

namespace zentest {

void EnsureApplication() {
    if (QCoreApplication::instance() != nullptr) return;
    // Editors need no display: set before the application reads it.
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM")) qputenv("QT_QPA_PLATFORM", "offscreen");
    static int argc = 1;
    static char name[] = "ZenAudioPluginsTests";
    static char* argv[] = {name, nullptr};
    new QApplication(argc, argv);
}

}  // namespace zentest

// The application lives until the process ends, and fontconfig keeps what
// Qt's font database asked of it: not ours to free.
extern "C" const char* __lsan_default_suppressions() { return "leak:libfontconfig.so\n"; }
