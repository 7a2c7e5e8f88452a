// Checks of the algorithm library's contracts (configurations, buffers):
// a failed check is reported with its condition, file and line through the
// trace and an optional handler, and the caller refuses the request. Never
// aborts: a bad configuration must not take the host's session down.
#pragma once

namespace ora::system {

using CheckHandler = void (*)(const char* condition, const char* file, int line);

// Null restores the default (trace only). Returns the previous handler.
CheckHandler SetCheckHandler(CheckHandler handler);

// Always returns false, so `return ReportCheck(...)` reads as a refusal.
bool ReportCheck(const char* condition, const char* file, int line);

}  // namespace ora::system

// True when the condition holds; otherwise reports it and yields false.
#define ORA_CHECK(condition) ((condition) ? true : ::ora::system::ReportCheck(#condition, __FILE__, __LINE__))
