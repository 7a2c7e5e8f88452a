// A file written beside its destination under a temporary name and renamed
// over the destination only when complete, so that a failed or interrupted
// run never leaves a partial file nor destroys an existing one.
#pragma once

#include <string>

namespace zenfx {

class TemporaryFile {
public:
    // Creates the temporary file in the destination's folder. Throws
    // ZenfxError when the folder cannot be written.
    explicit TemporaryFile(const std::string& destination);
    ~TemporaryFile();  // removes the temporary file unless committed
    TemporaryFile(const TemporaryFile&) = delete;
    TemporaryFile& operator=(const TemporaryFile&) = delete;

    int Descriptor() const { return m_fd; }
    const std::string& Path() const { return m_path; }

    // The descriptor now belongs to someone who closes it (libsndfile).
    void ReleaseDescriptor() { m_fd = -1; }

    // Closes the descriptor if still held and renames to the destination.
    void Commit();

private:
    std::string m_destination;
    std::string m_path;
    int m_fd = -1;
    bool m_committed = false;
};

// Writes text to a file through a TemporaryFile.
void WriteFileAtomically(const std::string& path, const std::string& text);

}  // namespace zenfx
