#include "Support/LimiterModel.h"

#include <algorithm>
#include <cfloat>
#include <cmath>

#include "Algorithms/TruePeak.h"

namespace zentest {

namespace {

const ora::numeric::TruePeakConfig kReader{1, 1.0f, ora::numeric::TruePeakFilter::Wideband};

float SoftCurve(float x, float knee) {
    if (!(std::fabs(x) >= knee)) return x;
    const float tanhOne = 0.7615941559557649f;
    const float y = knee * std::tanh(std::fabs(x) / knee) / tanhOne;
    return x < 0.0f ? -y : y;
}

}  // namespace

std::size_t LimiterModel::TruePeakLatency() const { return ora::numeric::TruePeak(kReader).GetLatency(); }

std::size_t LimiterModel::LookAhead() const {
    return std::max<std::size_t>(TruePeakLatency(), static_cast<std::size_t>(std::lround(0.5 * sampleRate / 1000.0)));
}

std::size_t LimiterModel::Block() const { return 2 * 4 * (TruePeakLatency() + LookAhead()); }

std::vector<std::vector<float>> LimiterModel::Run(const std::vector<std::vector<float>>& input,
                                                  std::vector<float>* gains) const {
    const std::size_t channels = input.size(), frames = input[0].size();
    const std::size_t L = TruePeakLatency(), D = LookAhead(), B = Block(), hold = 4 * (L + D);
    const double fs = std::trunc(sampleRate);

    const float fixedCeiling = std::max(static_cast<float>(std::pow(10.0, (ceilingDb - 0.2) / 20.0)), FLT_MIN);
    const auto C = [&](std::size_t t) { return ceiling.empty() ? fixedCeiling : ceiling[t]; };
    const double releaseSamples = std::max(1.0, std::trunc(fs * releaseMs / 1000.0));
    const float c = static_cast<float>(std::exp(-1.0 / (4.0 * releaseSamples)));
    const float oneMinusC = 1.0f - c;

    // Blocks k = -1, 0, 1, ... as index k + 1; block k's law starts at output
    // time L + (k + 1) B, when its last reading is in.
    const std::size_t blocks = frames / B + 2;
    std::vector<float> target(blocks, 1.0f), knee(blocks, 1.0f);
    std::vector<std::vector<bool>> softened(channels, std::vector<bool>(blocks, false));
    std::vector<std::vector<float>> truePeak(channels, std::vector<float>(blocks, 0.0f));
    for (std::size_t ch = 0; ch < channels; ++ch) {
        ora::numeric::TruePeak reader(kReader);
        std::vector<float> padded(input[ch]);
        padded.resize(blocks * B + L, 0.0f);
        truePeak[ch][0] = reader.Process(padded.data(), L);
        for (std::size_t b = 1; b < blocks; ++b) truePeak[ch][b] = reader.Process(padded.data() + L + (b - 1) * B, B);
    }
    for (std::size_t b = 0; b < blocks; ++b) {
        const std::size_t decided = L + b * B - 1;  // the block's last reading
        const float ceilingNow = C(std::min(decided, frames - 1));
        knee[b] = std::max(0.25f, std::min(ceilingNow, 1.0f));
        float peak = 0.0f;
        for (std::size_t ch = 0; ch < channels; ++ch) {
            float samplePeak = 0.0f;
            if (b > 0)
                for (std::size_t n = (b - 1) * B; n < std::min(b * B, frames); ++n)
                    samplePeak = std::max(samplePeak, std::fabs(input[ch][n]));
            softened[ch][b] = soft && truePeak[ch][b] > ceilingNow;
            peak = std::max(peak, softened[ch][b] ? SoftCurve(samplePeak, knee[b]) : truePeak[ch][b]);
        }
        target[b] = peak > 0.0f ? std::min(1.0f, ceilingNow / peak) : 1.0f;
    }

    std::vector<std::vector<float>> output(channels, std::vector<float>(frames, 0.0f));
    if (gains != nullptr) gains->assign(frames, 1.0f);
    float g = 1.0f, T = 1.0f;
    std::size_t holdCounter = 0;
    const std::size_t latency = B + L + D;
    for (std::size_t t = 0; t < frames; ++t) {
        if (t >= L && (t - L) % B == 0) {
            T = target[(t - L) / B];
            holdCounter = hold;
        }
        if (g > T) {
            g = T;
        } else if (holdCounter > 0) {
            --holdCounter;
        } else {
            g = oneMinusC * T + c * g;
        }
        g = std::min(g, 1.0f);
        if (gains != nullptr) (*gains)[t] = g;
        if (t < latency) continue;
        const std::size_t n = t - latency, b = n / B + 1;
        for (std::size_t ch = 0; ch < channels; ++ch) {
            const float x = softened[ch][b] ? SoftCurve(input[ch][n], knee[b]) : input[ch][n];
            output[ch][t] = x * g;
        }
    }
    return output;
}

}  // namespace zentest
