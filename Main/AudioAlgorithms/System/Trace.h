// Diagnostic trace lines of the algorithm library, written to stderr only
// when the environment variable ORA_TRACE is set (never on the audio path).
#pragma once

namespace ora::system {

bool TraceEnabled();
void Trace(const char* format, ...) __attribute__((format(printf, 1, 2)));

}  // namespace ora::system
