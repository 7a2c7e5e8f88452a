#include "SurroundImage.h"

#include <algorithm>
#include <cmath>

namespace zen {

namespace {
constexpr double kPi = 3.141592653589793;
constexpr double kDegrees = 180.0 / kPi;
}  // namespace

void SurroundImage::Configure(std::size_t channels, int lfe) {
    m_channels = SpeakerLayout::HasAzimuths(channels) ? channels : 0;
    for (std::size_t c = 0; c < m_channels; ++c) {
        const double azimuth = SpeakerLayout::Azimuth(channels, c) / kDegrees;
        m_x[c] = std::sin(azimuth);
        m_y[c] = std::cos(azimuth);
        m_used[c] = !(lfe >= 0 && c == static_cast<std::size_t>(lfe));
    }
}

SurroundImage::Image SurroundImage::Compute(const double* powers) const noexcept {
    Image image;
    double x = 0.0, y = 0.0, total = 0.0;
    for (std::size_t c = 0; c < m_channels; ++c) {
        if (!m_used[c]) continue;
        x += powers[c] * m_x[c];
        y += powers[c] * m_y[c];
        total += powers[c];
    }
    if (!(total > 0.0)) return image;
    image.length = std::min(1.0, std::hypot(x, y) / total);
    image.direction = std::atan2(x, y) * kDegrees;
    image.spread = 2.0 * std::acos(image.length) * kDegrees;
    image.valid = true;
    return image;
}

}  // namespace zen
