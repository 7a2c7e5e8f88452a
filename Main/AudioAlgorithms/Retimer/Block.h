// A block of planar channels handed to the re-timer.
#pragma once

#include <cstddef>

namespace ora::retimer {

struct Block {
    float* const* channels = nullptr;
    std::size_t channelCount = 0;
    std::size_t length = 0;

    std::size_t GetLength() const { return length; }
};

}  // namespace ora::retimer
