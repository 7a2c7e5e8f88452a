// CorrelationMeter: correlation, balance and mid/side levels of signals
// whose stereo image is known, the averaging time, the whole-programme
// readings, block splits and bad samples.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "Common/Algorithms/CorrelationMeter.h"
#include "Support/Signals.h"

namespace {

struct Readings {
    CorrelationMeter::Image current, overall;
};

Readings Measure(std::vector<float> left, std::vector<float> right, float timeMs = 300.0f, std::size_t block = 512) {
    CorrelationMeter meter;
    meter.SetChannelCount(2);
    meter.Prepare(48000.0f, 512);
    meter.SetParameter(CorrelationMeter::kTime, timeMs);
    for (std::size_t done = 0; done < left.size(); done += block) {
        float* p[2] = {left.data() + done, right.data() + done};
        EXPECT_TRUE(meter.Process(p, std::min(block, left.size() - done)));
    }
    return {meter.Current(), meter.Overall()};
}

std::vector<float> Scaled(std::vector<float> x, float g) {
    for (float& v : x) v *= g;
    return x;
}

}  // namespace

TEST(CorrelationMeter, ReadsTheImageOfKnownStereoSignals) {
    const std::vector<float> a = zentest::Sine(440.0, 48000.0, 48000, 0.5);
    const std::vector<float> b = zentest::Noise(48000, 0.5, 9);
    const std::vector<float> silence(48000, 0.0f);
    struct Case {
        const char* what;
        std::vector<float> left, right;
        double correlation, balance, midDb, sideDb;
    } cases[] = {
        // A sine of peak 0.5 has an RMS of -9.03 dBFS.
        {"mono", a, a, 1.0, 0.0, -9.03, -HUGE_VAL},
        {"opposite polarity", a, Scaled(a, -1.0f), -1.0, 0.0, -HUGE_VAL, -9.03},
        {"left only", a, silence, 0.0, -1.0, -15.05, -15.05},
        {"right 6 dB down", a, Scaled(a, 0.5f), 1.0, (0.25 - 1.0) / 1.25, 20 * std::log10(0.75 * 0.3536),
         20 * std::log10(0.25 * 0.3536)},
        // Noise of peak 0.5 has a mean square of 0.25 / 3.
        {"unrelated", a, b, 0.0, (0.0833 - 0.125) / (0.0833 + 0.125), -12.83, -12.83},
    };
    for (const Case& c : cases) {
        const Readings run = Measure(c.left, c.right);
        for (const CorrelationMeter::Image& image : {run.current, run.overall}) {
            EXPECT_NEAR(image.correlation, c.correlation, 0.03) << c.what;
            EXPECT_NEAR(image.balance, c.balance, 0.03) << c.what;
            if (std::isfinite(c.midDb)) {
                EXPECT_NEAR(20.0 * std::log10(image.midRms), c.midDb, 0.2) << c.what;
            } else {
                EXPECT_LT(image.midRms, 1e-6) << c.what;
            }
            if (std::isfinite(c.sideDb)) {
                EXPECT_NEAR(20.0 * std::log10(image.sideRms), c.sideDb, 0.2) << c.what;
            } else {
                EXPECT_LT(image.sideRms, 1e-6) << c.what;
            }
        }
    }
    // Silence has no image.
    const Readings quiet = Measure(silence, silence);
    EXPECT_EQ(quiet.current.correlation, 0.0);
    EXPECT_EQ(quiet.current.balance, 0.0);
}

TEST(CorrelationMeter, FollowsWithItsTimeConstantAndKeepsTheWholeProgramme) {
    // A switch from mono to opposite polarity: after one time constant the
    // product has moved 1 - 1/e of the way, so the correlation reads
    // 1 - 2 (1 - 1/e) while the whole programme reads 0.
    for (float timeMs : {50.0f, 300.0f, 2000.0f}) {
        const auto settle = static_cast<std::size_t>(48.0 * timeMs * 10.0);
        const auto step = static_cast<std::size_t>(48.0 * timeMs);
        std::vector<float> left(settle + step, 0.5f), right(settle + step, 0.5f);
        for (std::size_t n = settle; n < left.size(); ++n) right[n] = -0.5f;
        const Readings run = Measure(left, right, timeMs);
        EXPECT_NEAR(run.current.correlation, 1.0 - 2.0 * (1.0 - std::exp(-1.0)), 0.01) << timeMs;
        EXPECT_NEAR(run.overall.correlation,
                    static_cast<double>(settle - step) / static_cast<double>(settle + step), 1e-9)
            << timeMs;
    }
}

TEST(CorrelationMeter, BlockSplitsAndBadSamplesChangeNothing) {
    std::vector<float> left = zentest::Noise(20000, 0.5, 3), right = zentest::Noise(20000, 0.5, 4);
    for (std::size_t n = 0; n < right.size(); ++n) right[n] += 0.5f * left[n];
    const Readings whole = Measure(left, right, 100.0f, left.size());
    for (std::size_t block : {1u, 17u, 480u}) {
        const Readings split = Measure(left, right, 100.0f, block);
        EXPECT_EQ(split.current.correlation, whole.current.correlation) << block;
        EXPECT_EQ(split.overall.sideRms, whole.overall.sideRms) << block;
    }
    // NaN and infinities read as silence.
    std::vector<float> dirtyLeft = left, cleanLeft = left;
    for (std::size_t n = 100; n < left.size(); n += 997) {
        dirtyLeft[n] = n % 2 ? std::numeric_limits<float>::quiet_NaN() : std::numeric_limits<float>::infinity();
        cleanLeft[n] = 0.0f;
    }
    const Readings dirty = Measure(dirtyLeft, right, 100.0f);
    const Readings clean = Measure(cleanLeft, right, 100.0f);
    EXPECT_EQ(dirty.current.correlation, clean.current.correlation);
    EXPECT_EQ(dirty.overall.balance, clean.overall.balance);
    // Only two channels make a stereo image.
    CorrelationMeter mono;
    mono.SetChannelCount(1);
    mono.Prepare(48000.0f, 512);
    float* p[1] = {left.data()};
    EXPECT_FALSE(mono.Process(p, 16));
}
