#include <gtest/gtest.h>

#include <cmath>
#include <random>

#include "Common/NoiseReduction/zn_noise_tracker.h"

namespace nr = zen::noise_reduction;

namespace {

constexpr std::size_t kBins = 257;
constexpr double kHop = 256.0 / 48000.0;

struct Feed {
    nr::zn_noise_tracker tracker;
    std::mt19937 random{7};
    std::vector<float> power = std::vector<float>(kBins);

    Feed() { tracker.Configure(1, kBins, kHop); }
    // `seconds` of noise frames of mean `level`, bins in `tone` raised to `toneLevel`.
    void Run(double seconds, float level, float voice = 1.0f, std::size_t toneFrom = 0, std::size_t toneTo = 0,
             float toneLevel = 0.0f) {
        std::exponential_distribution<float> periodogram(1.0f);
        for (int f = 0; f < static_cast<int>(seconds / kHop); ++f) {
            for (std::size_t k = 0; k < kBins; ++k)
                power[k] = (k >= toneFrom && k < toneTo ? toneLevel : level) * periodogram(random);
            tracker.Update(0, power.data(), voice);
        }
    }
    // The estimate's mean over bins [from, to) in dB.
    double Db(std::size_t from = 0, std::size_t to = kBins) const {
        double sum = 0.0;
        for (std::size_t k = from; k < to; ++k) sum += tracker.Noise(0)[k];
        return 10.0 * std::log10(sum / static_cast<double>(to - from));
    }
};

}  // namespace

// Stationary noise is estimated within a dB; a rise of the noise floor is
// followed within about the minimum window, a fall with the smoothed power.
TEST(zn_noise_tracker, FollowsTheNoiseFloorUpAndDown) {
    Feed f;
    f.Run(0.3, 1.0f);
    EXPECT_NEAR(f.Db(), 0.0, 1.0) << "from the start";
    f.Run(0.7, 1.0f);
    EXPECT_NEAR(f.Db(), 0.0, 1.0);
    f.Run(2.0, 10.0f);
    EXPECT_NEAR(f.Db(), 10.0, 1.5) << "10 dB up, 2 s later";
    f.Run(0.3, 0.1f);
    EXPECT_LT(f.Db(), 0.0) << "20 dB down, 300 ms later: more than halfway";
    f.Run(0.7, 0.1f);
    EXPECT_NEAR(f.Db(), -10.0, 1.0) << "20 dB down, a second later";
}

// Bins where something stands well above the noise (a voice's harmonic) keep
// their estimate for the half second it lasts, from its first frame on,
// unless the owner says there is no voice: then every bin is noise.
TEST(zn_noise_tracker, HoldsUnderSpeechUnlessToldThereIsNone) {
    Feed f;
    f.Run(1.0, 1.0f);
    f.Run(0.5, 1.0f, 1.0f, 50, 60, 100.0f);
    EXPECT_LT(f.Db(50, 60), 1.0) << "20 dB harmonic";
    EXPECT_NEAR(f.Db(100, 200), 0.0, 1.0);
    f.Run(0.5, 1.0f, 0.0f, 50, 60, 100.0f);
    EXPECT_GT(f.Db(50, 60), 15.0) << "voice 0";
    for (std::size_t k = 0; k < kBins; ++k) EXPECT_LE(f.tracker.Presence(0)[k], 1e-3f);
}
