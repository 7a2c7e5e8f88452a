// What zenfx does when told to stop by SIGHUP (a closed terminal or ssh
// session), SIGINT, SIGTERM or SIGPIPE: removes every output file not yet
// complete, says so on stderr, and ends by the same signal, so that a shell
// sees 128 plus its number (129, 130, 143). Signals the caller ignores
// (nohup, background jobs) stay ignored. A file beyond the size limit fails
// to write (SIGXFSZ ignored) and is reported and removed like any other.
#pragma once

namespace zenfx {

void InstallSignalCleanup();

}  // namespace zenfx
