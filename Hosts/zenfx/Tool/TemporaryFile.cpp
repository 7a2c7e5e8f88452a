#include "TemporaryFile.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "ZenfxError.h"

namespace zenfx {

namespace {

mode_t DefaultFileMode() {
    const mode_t mask = umask(0);
    umask(mask);
    return 0666 & ~mask;
}

}  // namespace

TemporaryFile::TemporaryFile(const std::string& destination) : m_destination(destination) {
    const std::size_t slash = destination.find_last_of('/');
    const std::string folder = slash == std::string::npos ? "." : destination.substr(0, slash);
    const std::string base = slash == std::string::npos ? destination : destination.substr(slash + 1);
    std::string pattern = folder + "/." + base + ".zenfx-XXXXXX";
    std::vector<char> buffer(pattern.begin(), pattern.end());
    buffer.push_back('\0');
    m_fd = mkstemp(buffer.data());
    if (m_fd < 0) throw ZenfxError("cannot write '" + destination + "': " + std::strerror(errno));
    m_path = buffer.data();
    fchmod(m_fd, DefaultFileMode());
}

TemporaryFile::~TemporaryFile() {
    if (m_fd >= 0) close(m_fd);
    if (!m_committed) unlink(m_path.c_str());
}

void TemporaryFile::Commit() {
    if (m_fd >= 0) {
        const bool closed = close(m_fd) == 0;
        m_fd = -1;
        if (!closed) throw ZenfxError("cannot write '" + m_destination + "': " + std::strerror(errno));
    }
    if (std::rename(m_path.c_str(), m_destination.c_str()) != 0)
        throw ZenfxError("cannot write '" + m_destination + "': " + std::strerror(errno));
    m_committed = true;
}

void WriteFileAtomically(const std::string& path, const std::string& text) {
    TemporaryFile file(path);
    std::size_t written = 0;
    while (written < text.size()) {
        const ssize_t n = write(file.Descriptor(), text.data() + written, text.size() - written);
        if (n < 0) {
            if (errno == EINTR) continue;
            throw ZenfxError("cannot write '" + path + "': " + std::strerror(errno));
        }
        written += static_cast<std::size_t>(n);
    }
    file.Commit();
}

}  // namespace zenfx
