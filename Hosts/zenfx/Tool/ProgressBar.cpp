#include "ProgressBar.h"

#include <unistd.h>

#include <algorithm>
#include <cstdio>

namespace zenfx {

namespace {
constexpr int kWidth = 40;
}

ProgressBar::ProgressBar(std::int64_t total) : m_total(std::max<std::int64_t>(total, 1)), m_enabled(isatty(2) != 0) {}

ProgressBar::~ProgressBar() {
    if (m_enabled && m_shown >= 0) std::fprintf(stderr, "\r%*s\r", kWidth + 8, "");
}

void ProgressBar::Update(std::int64_t done) {
    if (!m_enabled) return;
    const int percent = static_cast<int>(std::min<std::int64_t>(100, done * 100 / m_total));
    if (percent == m_shown) return;
    m_shown = percent;
    const int filled = percent * kWidth / 100;
    std::fprintf(stderr, "\r[%.*s%*s] %3d%%", filled, "########################################", kWidth - filled, "",
                 percent);
    std::fflush(stderr);
}

}  // namespace zenfx
