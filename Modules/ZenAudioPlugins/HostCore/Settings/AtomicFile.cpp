#include "AtomicFile.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <vector>

#include "HostCore/HostError.h"

namespace zen::host {

namespace {

std::string Folder(const std::string& path) {
    const std::size_t slash = path.find_last_of('/');
    return slash == std::string::npos ? "." : (slash == 0 ? "/" : path.substr(0, slash));
}

HostError WriteError(const std::string& path) {
    return HostError("cannot write '" + path + "': " + std::strerror(errno));
}

}  // namespace

AtomicFile::AtomicFile(const std::string& destination) : m_destination(destination) {
    const std::size_t slash = destination.find_last_of('/');
    const std::string base = slash == std::string::npos ? destination : destination.substr(slash + 1);
    const std::string pattern = Folder(destination) + "/." + base + ".tmp-XXXXXX";
    std::vector<char> buffer(pattern.begin(), pattern.end());
    buffer.push_back('\0');
    m_fd = mkostemp(buffer.data(), O_CLOEXEC);
    if (m_fd < 0) throw WriteError(destination);
    m_path = buffer.data();
    // mkstemp makes the file private; give it what a new file would get.
    const mode_t mask = umask(0);
    umask(mask);
    fchmod(m_fd, 0666 & ~mask);
}

AtomicFile::~AtomicFile() {
    if (m_fd >= 0) close(m_fd);
    if (!m_committed) unlink(m_path.c_str());
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
        const bool closed = close(m_fd) == 0;
        m_fd = -1;
        if (!flushed || !closed) throw WriteError(m_destination);
    } else {
        // A writer closed it; flush through a fresh descriptor.
        const int fd = open(m_path.c_str(), O_RDONLY | O_CLOEXEC);
        if (fd < 0 || fsync(fd) != 0) {
            if (fd >= 0) close(fd);
            throw WriteError(m_destination);
        }
        close(fd);
    }
    if (std::rename(m_path.c_str(), m_destination.c_str()) != 0) throw WriteError(m_destination);
    m_committed = true;
    // The rename itself reaches the disk with the folder.
    const int folder = open(Folder(m_destination).c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
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

}  // namespace zen::host
