#include "NameSuggestions.h"

#include <algorithm>
#include <cctype>
#include <set>

namespace zenfx {

namespace {

std::string Lower(const std::string& s) {
    std::string out = s;
    std::transform(out.begin(), out.end(), out.begin(), [](unsigned char c) { return std::tolower(c); });
    return out;
}

std::size_t EditDistance(const std::string& a, const std::string& b) {
    std::vector<std::size_t> row(b.size() + 1);
    for (std::size_t j = 0; j <= b.size(); ++j) row[j] = j;
    for (std::size_t i = 1; i <= a.size(); ++i) {
        std::size_t diagonal = row[0];
        row[0] = i;
        for (std::size_t j = 1; j <= b.size(); ++j) {
            const std::size_t above = row[j];
            row[j] = std::min({row[j] + 1, row[j - 1] + 1, diagonal + (a[i - 1] == b[j - 1] ? 0 : 1)});
            diagonal = above;
        }
    }
    return row[b.size()];
}

}  // namespace

bool EqualsIgnoreCase(const std::string& a, const std::string& b) { return Lower(a) == Lower(b); }

std::vector<std::string> ClosestNames(const std::string& typed, const std::vector<std::string>& candidates,
                                      std::size_t most) {
    const std::string needle = Lower(typed);
    std::vector<std::pair<std::size_t, std::string>> scored;
    std::set<std::string> seen;
    for (const std::string& candidate : candidates) {
        if (!seen.insert(candidate).second) continue;
        const std::string hay = Lower(candidate);
        std::size_t distance = EditDistance(needle, hay);
        // A typed fragment of a longer name ("clip" for "Soft Clipper") counts as close.
        if (!needle.empty() && hay.find(needle) != std::string::npos) distance = std::min<std::size_t>(distance, 1);
        const std::size_t allowed = std::max<std::size_t>(2, std::min(needle.size(), hay.size()) / 3);
        if (distance <= allowed) scored.emplace_back(distance, candidate);
    }
    std::stable_sort(scored.begin(), scored.end(), [](const auto& x, const auto& y) { return x.first < y.first; });
    std::vector<std::string> out;
    for (std::size_t i = 0; i < scored.size() && i < most; ++i) out.push_back(scored[i].second);
    return out;
}

std::string DidYouMean(const std::string& typed, const std::vector<std::string>& candidates) {
    const std::vector<std::string> names = ClosestNames(typed, candidates);
    if (names.empty()) return {};
    std::string text = "; did you mean ";
    for (std::size_t i = 0; i < names.size(); ++i) {
        if (i > 0) text += i + 1 == names.size() ? " or " : ", ";
        text += "'" + names[i] + "'";
    }
    return text + "?";
}

}  // namespace zenfx
