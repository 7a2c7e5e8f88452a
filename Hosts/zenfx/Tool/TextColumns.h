// Columns of UTF-8 text for the terminal: widths in characters, not bytes
// ("m²" is two characters wide, three bytes long).
#pragma once

#include <cstddef>
#include <string>

namespace zenfx {

// Characters of UTF-8 text (every one a column wide: no wide scripts here).
std::size_t DisplayWidth(const std::string& text);

// `text` followed by spaces up to `width` columns.
std::string PadRight(const std::string& text, std::size_t width);

}  // namespace zenfx
