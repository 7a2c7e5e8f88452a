#include "ClipTracker.h"

#include <algorithm>
#include <cmath>

namespace zen::host {

void ClipTracker::Truncate(std::size_t entry) {
    if (entry < m_entries.size()) m_entries.resize(entry);
}

void ClipTracker::Append(bool speech, double loudness, std::int64_t gapEntries) {
    Entry next = m_entries.empty() ? Entry{} : m_entries.back();
    const bool startsClip = m_entries.empty() || next.count == 0 || next.pauseRun >= gapEntries;
    next.pauseRun = speech ? 0 : next.pauseRun + 1;
    if (speech) {
        if (startsClip) {
            next.clipStart = m_entries.size();
            next.energy = 0.0;
            next.count = 0;
            next.loudest = loudness;
        }
        next.energy += std::pow(10.0, loudness / 10.0);
        ++next.count;
        next.loudest = std::max(next.loudest, loudness);
    }
    m_entries.push_back(next);
}

ClipTracker::Stretch ClipTracker::ClipUpTo(std::size_t entry, std::size_t last) const {
    last = std::min(last, m_entries.size() - 1);
    const std::size_t start = m_entries[entry].clipStart;
    while (last > entry && m_entries[last].clipStart != start) --last;
    const Entry& e = m_entries[last];
    Stretch s;
    s.loudness = e.count > 0 ? 10.0 * std::log10(e.energy / static_cast<double>(e.count)) : -200.0;
    s.loudest = e.loudest;
    return s;
}

}  // namespace zen::host
