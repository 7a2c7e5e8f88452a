// A file replaced whole or not at all: written under a temporary name in the
// destination's folder, flushed to disk, then renamed over the destination.
// A crash or a kill at any moment leaves the old file or the new one, never
// a mixture; an abandoned temporary file is removed by the destructor.
#pragma once

#include <string>

namespace zen::host {

class AtomicFile {
public:
    // Throws HostError when the folder cannot be written.
    explicit AtomicFile(const std::string& destination);
    ~AtomicFile();
    AtomicFile(const AtomicFile&) = delete;
    AtomicFile& operator=(const AtomicFile&) = delete;

    int Descriptor() const { return m_fd; }
    const std::string& Path() const { return m_path; }
    // The descriptor now belongs to a writer that closes it (libsndfile).
    void ReleaseDescriptor() { m_fd = -1; }

    void Write(const std::string& text);
    // Flushes, closes and renames; throws HostError.
    void Commit();

    // Writes `text` to `path` this way.
    static void Replace(const std::string& path, const std::string& text);

private:
    std::string m_destination;
    std::string m_path;
    int m_fd = -1;
    bool m_committed = false;
};

}  // namespace zen::host
