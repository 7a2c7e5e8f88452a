#include "OctaveBands.h"

#include <algorithm>
#include <cmath>

namespace zen {

double OctaveBands::Centre(std::size_t band) {
    return 1000.0 * std::pow(10.0, static_cast<double>(kFirstIndex + static_cast<int>(band)) / 10.0);
}
double OctaveBands::LowerEdge(std::size_t band) { return Centre(band) * std::pow(10.0, -0.05); }
double OctaveBands::UpperEdge(std::size_t band) { return Centre(band) * std::pow(10.0, 0.05); }

void OctaveBands::Configure(double sampleRate, std::size_t fftSize) {
    const double binWidth = sampleRate / static_cast<double>(fftSize);
    const double lastBin = static_cast<double>(fftSize / 2);
    for (std::size_t b = 0; b < kBands; ++b) {
        // Bin k spans [k - 1/2, k + 1/2] in bins; the band [lo, hi].
        const double lo = LowerEdge(b) / binWidth;
        const double hi = std::min(UpperEdge(b) / binWidth, lastBin + 0.5);
        Span span;
        if (hi <= lo) {
            span.first = 1;  // empty
            m_spans[b] = span;
            continue;
        }
        span.first = static_cast<std::size_t>(std::floor(lo + 0.5));
        span.last = static_cast<std::size_t>(std::min(lastBin, std::ceil(hi - 0.5)));
        auto share = [&](std::size_t k) {
            const double from = std::max(lo, static_cast<double>(k) - 0.5);
            const double to = std::min(hi, static_cast<double>(k) + 0.5);
            return static_cast<float>(std::max(0.0, to - from));
        };
        span.firstShare = share(span.first);
        span.lastShare = share(span.last);
        m_spans[b] = span;
    }
}

void OctaveBands::Compute(const float* power, float* bands, float scale) const noexcept {
    for (std::size_t b = 0; b < kBands; ++b) {
        const Span& s = m_spans[b];
        if (s.last < s.first) {
            bands[b] = 0.0f;
            continue;
        }
        if (s.first == s.last) {
            bands[b] = scale * s.firstShare * power[s.first];
            continue;
        }
        float sum = s.firstShare * power[s.first] + s.lastShare * power[s.last];
        for (std::size_t k = s.first + 1; k < s.last; ++k) sum += power[k];
        bands[b] = scale * sum;
    }
}

}  // namespace zen
