// Debug assertions for programming errors. The message, the source file and
// the line go to the toolkit's debug message stream; debug builds then abort
// unless a handler has been installed (tests install one to observe them).
#pragma once

namespace zen {

using AssertionHandler = void (*)(const char* message, const char* file, int line);

// Replaces the default behaviour; null restores it. Returns the previous one.
AssertionHandler SetAssertionHandler(AssertionHandler handler);

void ReportAssertion(const char* message, const char* file, int line);

}  // namespace zen

#define ZEN_ASSERT(condition, message)                             \
    do {                                                           \
        if (!(condition)) ::zen::ReportAssertion(message, __FILE__, __LINE__); \
    } while (false)
