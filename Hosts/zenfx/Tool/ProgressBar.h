// A one-line progress bar on stderr, drawn only when stderr is a terminal.
#pragma once

#include <cstdint>

namespace zenfx {

class ProgressBar {
public:
    explicit ProgressBar(std::int64_t total);
    ~ProgressBar();  // clears the line
    void Update(std::int64_t done);

private:
    std::int64_t m_total;
    int m_shown = -1;  // percent last drawn
    bool m_enabled;
};

}  // namespace zenfx
