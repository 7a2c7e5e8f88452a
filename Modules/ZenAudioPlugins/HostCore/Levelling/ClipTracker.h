// Splits a stream of entries into clips, speech separated by pauses of at
// least a gap, and keeps each clip's running speech loudness and loudest
// entry, so that any stretch from a clip's start is read in constant time.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

namespace zen::host {

class ClipTracker {
public:
    struct Stretch {
        double loudness = 0.0;  // energy mean of the speech entries, LUFS
        double loudest = 0.0;   // the loudest speech entry, LUFS
    };

    void Clear() { m_entries.clear(); }
    // Forgets entry `entry` and those after it.
    void Truncate(std::size_t entry);
    std::size_t Size() const { return m_entries.size(); }

    // The next entry: its speech loudness when `speech`. A speech entry after
    // at least `gapEntries` entries without speech starts a new clip.
    void Append(bool speech, double loudness, std::int64_t gapEntries);

    // From the start of `entry`'s clip up to `last` (or the clip's end if it
    // comes first); `entry` must lie in a clip with speech up to it.
    Stretch ClipUpTo(std::size_t entry, std::size_t last) const;

private:
    struct Entry {
        std::size_t clipStart = 0;
        std::int64_t pauseRun = 0;  // entries without speech up to this one
        double energy = 0.0;        // sum over the clip's speech so far
        std::int64_t count = 0;
        double loudest = -1e9;
    };
    std::vector<Entry> m_entries;
};

}  // namespace zen::host
