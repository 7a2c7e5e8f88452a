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
