#include "SignalCleanup.h"

#include <signal.h>
#include <unistd.h>

#include <cstring>

#include "HostCore/Settings/AtomicFile.h"

namespace zenfx {

namespace {

struct StopSignal {
    int number;
    const char* name;
};
constexpr StopSignal kStopSignals[] = {{SIGHUP, "SIGHUP"}, {SIGINT, "SIGINT"}, {SIGTERM, "SIGTERM"}, {SIGPIPE, "SIGPIPE"}};

bool g_startNewLine = false;  // a progress bar may be half drawn on a terminal

void Say(const char* text) {
    const ssize_t ignored = write(STDERR_FILENO, text, std::strlen(text));
    (void)ignored;
}

// Only async-signal-safe calls from here on.
extern "C" void OnStopSignal(int number) {
    zen::host::AtomicFile::RemoveTemporaries();
    const char* name = "a signal";
    for (const StopSignal& s : kStopSignals)
        if (s.number == number) name = s.name;
    // A broken pipe is most likely where this would go.
    if (number != SIGPIPE) {
        if (g_startNewLine) Say("\n");
        Say("zenfx: stopped by ");
        Say(name);
        Say("; unfinished output files removed\n");
    }
    // Blocked while this handler runs: delivered, by default, as it returns.
    struct sigaction standard {};
    standard.sa_handler = SIG_DFL;
    sigemptyset(&standard.sa_mask);
    sigaction(number, &standard, nullptr);
    raise(number);
}

}  // namespace

void InstallSignalCleanup() {
    g_startNewLine = isatty(STDERR_FILENO) != 0;
    for (const StopSignal& s : kStopSignals) {
        struct sigaction previous {};
        if (sigaction(s.number, nullptr, &previous) == 0 && previous.sa_handler == SIG_IGN) continue;
        struct sigaction cleanup {};
        cleanup.sa_handler = OnStopSignal;
        sigemptyset(&cleanup.sa_mask);
        for (const StopSignal& other : kStopSignals) sigaddset(&cleanup.sa_mask, other.number);
        sigaction(s.number, &cleanup, nullptr);
    }
    signal(SIGXFSZ, SIG_IGN);
}

}  // namespace zenfx
