#include "Algorithms/KaiserLowPass.h"

#include <algorithm>
#include <cmath>

namespace ora::numeric {

double BesselI0(double x) {
    // Power series; terms fall fast for the window's arguments (x < 30).
    double sum = 1.0, term = 1.0;
    const double half = 0.5 * x;
    for (int k = 1; k < 200; ++k) {
        term *= (half / k) * (half / k);
        sum += term;
        if (term < sum * 1e-17) break;
    }
    return sum;
}

std::vector<float> KaiserLowPass(std::size_t taps, double cutoff, double beta) {
    constexpr double kPi = 3.141592653589793;
    std::vector<double> h(taps);
    const double centre = 0.5 * static_cast<double>(taps - 1);
    const double norm = BesselI0(beta);
    double sum = 0.0;
    for (std::size_t i = 0; i < taps; ++i) {
        const double t = static_cast<double>(i) - centre;
        const double sinc = t == 0.0 ? 2.0 * cutoff : std::sin(2.0 * kPi * cutoff * t) / (kPi * t);
        const double r = centre > 0.0 ? t / centre : 0.0;
        const double window = BesselI0(beta * std::sqrt(std::max(0.0, 1.0 - r * r))) / norm;
        h[i] = sinc * window;
        sum += h[i];
    }
    std::vector<float> out(taps);
    for (std::size_t i = 0; i < taps; ++i) out[i] = static_cast<float>(h[i] / sum);
    return out;
}

}  // namespace ora::numeric
