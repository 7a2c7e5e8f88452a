#include "ZenAssert.h"

#include <QDebug>
#include <atomic>
#include <cstdlib>

namespace zen {

namespace {
std::atomic<AssertionHandler> g_handler{nullptr};
}

AssertionHandler SetAssertionHandler(AssertionHandler handler) {
    return g_handler.exchange(handler);
}

void ReportAssertion(const char* message, const char* file, int line) {
    qDebug().nospace() << "ASSERT: \"" << message << "\" in file " << file << ", line " << line;
    if (AssertionHandler handler = g_handler.load()) {
        handler(message, file, line);
        return;
    }
#ifndef NDEBUG
    std::abort();
#endif
}

}  // namespace zen
