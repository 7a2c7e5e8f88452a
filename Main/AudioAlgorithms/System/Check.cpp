#include "System/Check.h"

#include <atomic>

#include "System/Trace.h"

namespace ora::system {

namespace {
std::atomic<CheckHandler> g_handler{nullptr};
}

CheckHandler SetCheckHandler(CheckHandler handler) { return g_handler.exchange(handler); }

bool ReportCheck(const char* condition, const char* file, int line) {
    Trace("ASSERT: \"%s\" in file %s, line %d", condition, file, line);
    if (CheckHandler handler = g_handler.load()) handler(condition, file, line);
    return false;
}

}  // namespace ora::system
