#include "Support/Dynamics.h"

#include <cmath>

namespace zentest {

std::vector<float> LevelSteps(std::size_t frames, const std::vector<std::pair<std::size_t, double>>& levelsDb) {
    std::vector<float> x(frames);
    for (const auto& [from, db] : levelsDb)
        for (std::size_t n = from; n < frames; ++n) x[n] = static_cast<float>((n % 2 ? 1 : -1) * std::pow(10.0, db / 20.0));
    return x;
}

double GainDb(const std::vector<float>& out, const std::vector<float>& in, std::size_t n) {
    return 20.0 * std::log10(std::fabs(static_cast<double>(out[n]) / in[n]));
}

double TimeConstantFrames(const std::vector<float>& out, const std::vector<float>& in, std::size_t from,
                          double startDb, double endDb) {
    const double target = startDb + (1.0 - std::exp(-1.0)) * (endDb - startDb);
    std::size_t n = from;
    while (n < out.size() && (endDb < startDb ? GainDb(out, in, n) > target : GainDb(out, in, n) < target)) ++n;
    return static_cast<double>(n + 1 - from);
}

}  // namespace zentest
