#include "Support/OversampledPeak.h"

#include <algorithm>
#include <cmath>

namespace zentest {

namespace {

constexpr double kPi = 3.14159265358979323846;
constexpr double kBeta = 9.0;

}  // namespace

OversampledPeak::OversampledPeak() : m_taps(static_cast<std::size_t>(kFactor * 2 * kHalfWidth)) {
    for (int p = 0; p < kFactor; ++p) {
        double sum = 0.0;
        for (int j = 0; j < 2 * kHalfWidth; ++j) {
            // Tap j weighs the input k = j - kHalfWidth + 1 samples after n,
            // for the point p / kFactor after n.
            const double tau = static_cast<double>(p) / kFactor - (j - kHalfWidth + 1);
            const double sinc = tau == 0.0 ? 1.0 : std::sin(kPi * tau) / (kPi * tau);
            const double r = tau / kHalfWidth;
            const double window =
                std::cyl_bessel_i(0.0, kBeta * std::sqrt(std::max(0.0, 1.0 - r * r))) / std::cyl_bessel_i(0.0, kBeta);
            m_taps[static_cast<std::size_t>(p * 2 * kHalfWidth + j)] = sinc * window;
            sum += sinc * window;
        }
        for (int j = 0; j < 2 * kHalfWidth; ++j) m_taps[static_cast<std::size_t>(p * 2 * kHalfWidth + j)] /= sum;
    }
}

double OversampledPeak::Point(const std::vector<double>& padded, std::size_t n, int phase) const {
    const double* taps = m_taps.data() + phase * 2 * kHalfWidth;
    const double* x = padded.data() + n + 1;  // x[j] is the input n - kHalfWidth + 1 + j
    double acc = 0.0;
    for (int j = 0; j < 2 * kHalfWidth; ++j) acc += taps[j] * x[j];
    return acc;
}

double OversampledPeak::Measure(const std::vector<float>& x, std::size_t begin, std::size_t end) const {
    std::vector<double> padded(x.size() + 2 * kHalfWidth + 1, 0.0);
    std::copy(x.begin(), x.end(), padded.begin() + kHalfWidth);
    double best = 0.0;
    std::size_t bestAt = 0;
    int bestPhase = 0;
    for (std::size_t n = begin; n < end && n < x.size(); ++n) {
        for (int p = 0; p < kFactor; ++p) {
            const double v = std::fabs(Point(padded, n, p));
            if (v > best) {
                best = v;
                bestAt = n;
                bestPhase = p;
            }
        }
    }
    if (best == 0.0) return 0.0;
    // Neighbours of the largest point, then the parabola's vertex.
    const auto at = [&](std::ptrdiff_t index) {
        if (index < 0 || static_cast<std::size_t>(index / kFactor) >= x.size()) return 0.0;
        return std::fabs(Point(padded, static_cast<std::size_t>(index / kFactor), static_cast<int>(index % kFactor)));
    };
    const std::ptrdiff_t index = static_cast<std::ptrdiff_t>(bestAt) * kFactor + bestPhase;
    const double a = at(index - 1), b = best, c = at(index + 1);
    const double d = 2.0 * b - a - c;
    return d > 0.0 ? b + (c - a) * (c - a) / (8.0 * d) : b;
}

}  // namespace zentest
