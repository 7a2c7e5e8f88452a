// "did you mean" suggestions for names a user mistyped.
#pragma once

#include <string>
#include <vector>

namespace zenfx {

// Case-insensitive equality of ASCII text.
bool EqualsIgnoreCase(const std::string& a, const std::string& b);

// Up to `most` candidates closest to `typed` (case-insensitive edit
// distance), closest first, only those close enough to be plausible.
std::vector<std::string> ClosestNames(const std::string& typed, const std::vector<std::string>& candidates,
                                      std::size_t most = 3);

// "; did you mean 'A' or 'B'?" or empty.
std::string DidYouMean(const std::string& typed, const std::vector<std::string>& candidates);

}  // namespace zenfx
