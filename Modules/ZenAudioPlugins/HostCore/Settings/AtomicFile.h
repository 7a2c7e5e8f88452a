// A file replaced whole or not at all: written under a temporary name in the
// destination's folder, flushed to disk, then renamed over the destination.
// A crash or a kill at any moment leaves the old file or the new one, never
// a mixture. An abandoned temporary file is removed by the destructor, by
// RemoveTemporaries (for a host's signal handlers) or, after a kill nothing
// can catch, by the next AtomicFile of the same destination.
//
// Temporaries are named ".<name>.tmp-<pid>-XXXXXX" beside the destination,
// the name cut (at a character) so that the whole fits a file name. A
// destination that is a symbolic link is written through it: the link stays.
#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace zen::host {

class AtomicFile {
public:
    // Longest part of the destination's name a temporary carries.
    static constexpr std::size_t kLongestNamePart = 232;
    // Temporaries RemoveTemporaries can reach at once; more still work.
    static constexpr int kSignalSlots = 16;

    // Removes stale temporaries of the destination (their process is gone),
    // then creates its own. Throws HostError when the destination is a
    // folder or no regular file, or its folder cannot be written.
    explicit AtomicFile(const std::string& destination);
    ~AtomicFile();
    AtomicFile(const AtomicFile&) = delete;
    AtomicFile& operator=(const AtomicFile&) = delete;

    int Descriptor() const { return m_fd; }
    const std::string& Path() const { return m_path; }
    const std::string& Destination() const { return m_destination; }
    // The descriptor now belongs to a writer that closes it (libsndfile).
    void ReleaseDescriptor() { m_fd = -1; }

    void Write(const std::string& text);
    // Flushes, closes and renames; throws HostError.
    void Commit();

    // Writes `text` to `path` this way.
    static void Replace(const std::string& path, const std::string& text);

    // Unlinks every temporary of this process not yet committed. Safe in a
    // signal handler: the process ends there, so it leaves no partial file.
    static void RemoveTemporaries() noexcept;

    // Temporaries of `destination` whose process is gone, by path.
    static std::vector<std::string> StaleTemporaries(const std::string& destination);

private:
    std::string m_destination;  // as given, for messages
    std::string m_target;       // through symbolic links
    std::string m_path;
    int m_fd = -1;
    int m_slot = -1;  // in the signal registry; -1 when not in it
    bool m_committed = false;
};

}  // namespace zen::host
