#include "AtomicFile.h"

#include <dirent.h>
#include <fcntl.h>
#include <limits.h>
#include <signal.h>
#include <sys/stat.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <cstdio>
#include <cstring>

#include "HostCore/HostError.h"

namespace zen::host {

namespace {

constexpr const char* kMarker = ".tmp-";
constexpr std::size_t kRandomPart = 6;  // mkstemp's XXXXXX

// Temporaries not yet committed, for RemoveTemporaries: plain characters and
// atomic states, so a signal handler can read them at any moment.
struct SignalSlot {
    std::atomic<int> state{0};  // 0 free, 1 being filled or emptied, 2 holds a path
    char path[PATH_MAX] = {};
};
SignalSlot g_slots[AtomicFile::kSignalSlots];

int Register(const std::string& path) {
    if (path.size() >= PATH_MAX) return -1;
    for (int s = 0; s < AtomicFile::kSignalSlots; ++s) {
        int expected = 0;
        if (!g_slots[s].state.compare_exchange_strong(expected, 1)) continue;
        std::memcpy(g_slots[s].path, path.c_str(), path.size() + 1);
        g_slots[s].state.store(2);
        return s;
    }
    return -1;
}

void Unregister(int slot) {
    if (slot < 0) return;
    g_slots[slot].state.store(1);
    g_slots[slot].path[0] = '\0';
    g_slots[slot].state.store(0);
}

std::string Folder(const std::string& path) {
    const std::size_t slash = path.find_last_of('/');
    return slash == std::string::npos ? "." : (slash == 0 ? "/" : path.substr(0, slash));
}

std::string BaseName(const std::string& path) {
    const std::size_t slash = path.find_last_of('/');
    return slash == std::string::npos ? path : path.substr(slash + 1);
}

HostError WriteError(const std::string& path) {
    return HostError("cannot write '" + path + "': " + std::strerror(errno));
}

// The destination through symbolic links, so that the rename replaces the
// file a link points to rather than the link. Refuses what is no file.
std::string Resolve(const std::string& destination) {
    if (destination.empty() || destination.back() == '/')
        throw HostError("cannot write '" + destination + "': it names a folder, not a file");
    struct stat info {};
    if (stat(destination.c_str(), &info) != 0) return destination;  // a new file (or a dangling link: replaced)
    if (S_ISDIR(info.st_mode)) throw HostError("cannot write '" + destination + "': it is a folder");
    if (!S_ISREG(info.st_mode))
        throw HostError("cannot write '" + destination +
                        "': it is not a regular file (a device, pipe or socket cannot be replaced whole)");
    char resolved[PATH_MAX];
    return realpath(destination.c_str(), resolved) != nullptr ? std::string(resolved) : destination;
}

// ".<name>.tmp-": the name cut at a character boundary to kLongestNamePart
// bytes, so that the pid and the random part still fit a file name.
std::string TemporaryPrefix(const std::string& destination) {
    std::string name = BaseName(destination);
    if (name.size() > AtomicFile::kLongestNamePart) {
        std::size_t cut = AtomicFile::kLongestNamePart;
        while (cut > 0 && (static_cast<unsigned char>(name[cut]) & 0xC0) == 0x80) --cut;
        name.resize(cut);
    }
    return "." + name + kMarker;
}

// The pid of a temporary "<prefix><pid>-XXXXXX", or 0 when the name is not one.
pid_t OwnerOf(const std::string& entry, const std::string& prefix) {
    if (entry.compare(0, prefix.size(), prefix) != 0) return 0;
    const std::size_t dash = entry.find('-', prefix.size());
    if (dash == std::string::npos || dash == prefix.size() || entry.size() != dash + 1 + kRandomPart) return 0;
    long pid = 0;
    for (std::size_t i = prefix.size(); i < dash; ++i) {
        if (entry[i] < '0' || entry[i] > '9' || pid > 99999999) return 0;
        pid = pid * 10 + (entry[i] - '0');
    }
    return static_cast<pid_t>(pid);
}

}  // namespace

std::vector<std::string> AtomicFile::StaleTemporaries(const std::string& destination) {
    std::vector<std::string> stale;
    const std::string folder = Folder(destination);
    const std::string prefix = TemporaryPrefix(destination);
    DIR* dir = opendir(folder.c_str());
    if (dir == nullptr) return stale;
    while (const dirent* entry = readdir(dir)) {
        const pid_t pid = OwnerOf(entry->d_name, prefix);
        // A process that still exists (even another user's) may be writing it.
        if (pid > 0 && pid != getpid() && kill(pid, 0) != 0 && errno == ESRCH)
            stale.push_back(folder + "/" + entry->d_name);
    }
    closedir(dir);
    return stale;
}

AtomicFile::AtomicFile(const std::string& destination) : m_destination(destination), m_target(Resolve(destination)) {
    for (const std::string& stale : StaleTemporaries(m_target)) unlink(stale.c_str());
    const std::string pattern =
        Folder(m_target) + "/" + TemporaryPrefix(m_target) + std::to_string(getpid()) + "-XXXXXX";
    std::vector<char> buffer(pattern.begin(), pattern.end());
    buffer.push_back('\0');
    // A signal handler must never find the file created but not yet listed.
    sigset_t all, previous;
    sigfillset(&all);
    pthread_sigmask(SIG_BLOCK, &all, &previous);
    m_fd = mkostemp(buffer.data(), O_CLOEXEC);
    const int error = errno;
    if (m_fd >= 0) m_slot = Register(buffer.data());
    pthread_sigmask(SIG_SETMASK, &previous, nullptr);
    errno = error;
    if (m_fd < 0) throw WriteError(destination);
    m_path = buffer.data();
    // mkstemp makes the file private; give it what the file it replaces had,
    // or what a new file would get.
    struct stat existing {};
    if (stat(m_target.c_str(), &existing) == 0) {
        fchmod(m_fd, existing.st_mode & 07777);
    } else {
        const mode_t mask = umask(0);
        umask(mask);
        fchmod(m_fd, 0666 & ~mask);
    }
}

AtomicFile::~AtomicFile() {
    if (m_fd >= 0) close(m_fd);
    if (!m_committed) unlink(m_path.c_str());
    Unregister(m_slot);
}

void AtomicFile::Write(const std::string& text) {
    std::size_t written = 0;
    while (written < text.size()) {
        const ssize_t n = write(m_fd, text.data() + written, text.size() - written);
        if (n < 0) {
            if (errno == EINTR) continue;
            throw WriteError(m_destination);
        }
        written += static_cast<std::size_t>(n);
    }
}

void AtomicFile::Commit() {
    if (m_fd >= 0) {
        const bool flushed = fsync(m_fd) == 0;
        const int error = errno;
        const bool closed = close(m_fd) == 0;
        m_fd = -1;
        if (!flushed) errno = error;
        if (!flushed || !closed) throw WriteError(m_destination);
    } else {
        // A writer closed it; flush through a fresh descriptor.
        const int fd = open(m_path.c_str(), O_RDONLY | O_CLOEXEC);
        if (fd < 0 || fsync(fd) != 0) {
            const int error = errno;
            if (fd >= 0) close(fd);
            errno = error;
            throw WriteError(m_destination);
        }
        close(fd);
    }
    if (std::rename(m_path.c_str(), m_target.c_str()) != 0) throw WriteError(m_destination);
    m_committed = true;
    Unregister(m_slot);
    m_slot = -1;
    // The rename itself reaches the disk with the folder.
    const int folder = open(Folder(m_target).c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (folder >= 0) {
        fsync(folder);
        close(folder);
    }
}

void AtomicFile::Replace(const std::string& path, const std::string& text) {
    AtomicFile file(path);
    file.Write(text);
    file.Commit();
}

void AtomicFile::RemoveTemporaries() noexcept {
    const int saved = errno;
    for (SignalSlot& slot : g_slots)
        if (slot.state.load() == 2) unlink(slot.path);
    errno = saved;
}

}  // namespace zen::host
