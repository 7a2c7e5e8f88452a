// "Limiter": its ceiling checked by an independent 16x true-peak measurement
// over sines, squares, impulses, noise, inter-sample-peak signals and
// music-like material at every ceiling, rate and block size; latency against
// an impulse; the soft stage, release, meters, and the plug-in's table.
#include <gtest/gtest.h>

#include <cmath>
#include <functional>

#include "Support/OversampledPeak.h"
#include "Plugins/ZenLimiter/ZenLimiter.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::Channels;
using zentest::PluginHarness;

namespace {

constexpr double kPi = 3.141592653589793;

struct Settings {
    float ceilingDb = 0.0f;
    float inputGainDb = 0.0f;
    float releaseMs = 1.0f;
    bool soft = false;
};

PluginHarness Limiter(const Settings& settings, std::uint32_t channels, float rate, std::uint32_t block) {
    return zentest::Prepared("Limiter",
                             {{"Ceiling", settings.ceilingDb}, {"Input Gain", settings.inputGainDb},
                              {"Release", settings.releaseMs}, {"Soft", settings.soft ? 1.0f : 0.0f}},
                             channels, rate, block);
}

std::vector<float> Limit(const std::vector<float>& input, const Settings& settings, float rate = 48000.0f,
                         std::uint32_t block = 512) {
    PluginHarness plugin = Limiter(settings, 1, rate, block);
    return plugin.Run(input, 1, block)[0];
}

double Db(double gain) { return 20.0 * std::log10(std::max(gain, 1e-30)); }

// Signals ------------------------------------------------------------------

std::vector<float> Square(double frequency, double rate, std::size_t frames, double amplitude) {
    std::vector<float> x(frames);
    for (std::size_t n = 0; n < frames; ++n)
        x[n] = static_cast<float>(std::sin(2.0 * kPi * frequency * n / rate) >= 0.0 ? amplitude : -amplitude);
    return x;
}

// Single samples and adjacent pairs (whose waveform peaks 2.1 dB above
// them, halfway between) at full scale, of both signs.
std::vector<float> Impulses(std::size_t frames) {
    std::vector<float> x(frames, 0.0f);
    for (std::size_t n = 300, k = 0; n + 1 < frames; n += 701, ++k) {
        const float sign = k % 2 == 0 ? 1.0f : -1.0f;
        x[n] = sign;
        if (k % 3 == 1) x[n + 1] = sign;
    }
    return x;
}

// fs/4 at 45 degrees with samples at +-1 (+3 dBTP), switched on and off,
// and a burst of fs/6 with its crests between samples.
std::vector<float> InterSamplePeaks(double rate, std::size_t frames) {
    std::vector<float> x(frames, 0.0f);
    for (std::size_t n = frames / 8; n < frames / 2; ++n) x[n] = ((n / 2) % 2 == 0) ? 1.0f : -1.0f;
    const double amplitude = 1.0 / std::cos(kPi / 6);  // samples at +-1, crest at +1.25 dB
    for (std::size_t n = frames / 2 + frames / 8; n < frames - frames / 8; ++n)
        x[n] = static_cast<float>(amplitude * std::sin(2.0 * kPi * (rate / 6) * n / rate + kPi / 3));
    return x;
}

// Notes with harmonics and decaying envelopes over a kick and hi-hats,
// loud enough to be limited most of the time.
std::vector<float> MusicLike(double rate, std::size_t frames) {
    std::vector<float> x(frames, 0.0f);
    const std::vector<float> noise = zentest::Noise(frames, 1.0, 77);
    const double notes[] = {110.0, 164.8, 220.0, 277.2, 329.6, 440.0, 659.3, 880.0};
    const std::size_t beat = static_cast<std::size_t>(rate * 0.125);
    for (std::size_t n = 0; n < frames; ++n) {
        const double t = static_cast<double>(n) / rate;
        const std::size_t bar = n / beat;
        const double local = static_cast<double>(n % beat) / rate;
        double v = 0.0;
        const double f = notes[bar % 8];
        for (int h = 1; h <= 12; ++h) v += std::sin(2.0 * kPi * f * h * t + h) / h * std::exp(-local * (3.0 + h));
        v += 1.2 * std::sin(2.0 * kPi * (50.0 + 120.0 * std::exp(-local * 30.0)) * local) * std::exp(-local * 12.0);
        if (bar % 2 == 1) v += 0.6 * noise[n] * std::exp(-local * 60.0);
        v += 0.2 * std::sin(2.0 * kPi * 9000.0 * t) * (0.5 + 0.5 * std::sin(2.0 * kPi * 3.0 * t));
        x[n] = static_cast<float>(0.9 * v);
    }
    return x;
}

// The ceiling check ----------------------------------------------------------

struct Run {
    std::string signal;
    std::vector<float> input;
    float rate;
    float ceilingDb;
    std::uint32_t block;
    float releaseMs = 1.0f;
};

constexpr float kRates[] = {44100.0f, 48000.0f, 96000.0f, 192000.0f};
constexpr float kCeilings[] = {0.0f, -1.0f, -3.0f, -12.0f, -24.0f};
constexpr std::uint32_t kBlocks[] = {1, 37, 512, 4096, 8192};
constexpr std::size_t kFrames = 8000;

// The output's true peak, leaving out the last stretch the checker's filter
// would see cut off: the stream goes on past the buffer.
double OutputTruePeak(const std::vector<float>& output) {
    static const zentest::OversampledPeak check;
    return check.Measure(output, 0, output.size() - zentest::OversampledPeak::kHalfWidth);
}

// Every signal at every rate, with the ceilings and block sizes rotating so
// that each rate meets each ceiling and each block size. Returns the closest
// approach to the ceiling in dB (negative: under it).
double ExpectCeilingHolds(const std::string& name, const std::function<std::vector<float>(double rate)>& make,
                          float gainDb = 0.0f, bool soft = false) {
    double closest = -100.0;
    for (std::size_t r = 0; r < std::size(kRates); ++r) {
        for (std::size_t k = 0; k < 2; ++k) {
            const float rate = kRates[r];
            const float ceiling = kCeilings[(r + 2 * k) % std::size(kCeilings)];
            const std::uint32_t block = kBlocks[(2 * r + 3 * k) % std::size(kBlocks)];
            Settings settings;
            settings.ceilingDb = ceiling;
            settings.inputGainDb = gainDb;
            settings.releaseMs = k == 0 ? 1.0f : 0.0f;
            settings.soft = soft;
            const std::vector<float> output = Limit(make(rate), settings, rate, block);
            const double peak = Db(OutputTruePeak(output));
            closest = std::max(closest, peak - ceiling);
            EXPECT_LE(peak, ceiling + 1e-4) << name << " at " << rate << " Hz, ceiling " << ceiling
                                            << " dBTP, blocks of " << block << ": true peak " << peak << " dBTP";
        }
    }
    return closest;
}

void ReportClosest(double closest) { std::printf("closest approach to the ceiling: %+.3f dB\n", closest); }

// Sines of 1.5 at two phases, one on a crest between samples.
double SinesHold(std::initializer_list<double> frequencies) {
    double closest = -100.0;
    for (double frequency : frequencies) {
        for (double phase : {0.7, kPi / 4}) {
            const auto sine = [&](double rate) { return zentest::Sine(frequency, rate, kFrames, 1.5, phase); };
            closest = std::max(closest, ExpectCeilingHolds("sine " + std::to_string(frequency) + " Hz", sine));
        }
    }
    return closest;
}

}  // namespace

TEST(ZenLimiter, MetersPerChannelAndTheirRestingValues) {
    PluginHarness plugin("Limiter");
    EXPECT_FALSE(plugin.Audio().SetParameter(4, 0.0f));
    plugin.Prepare(2);
    const char* meters[][2] = {{"Gain Reduction", "dB"}, {"Input True Peak 1", "dBTP"}, {"Output Peak 1", "dBFS"},
                               {"Input True Peak 2", "dBTP"}, {"Output Peak 2", "dBFS"}};
    ASSERT_EQ(plugin.Audio().GetMeterCount(), 5u);
    for (std::uint32_t i = 0; i < 5; ++i) {
        zen::MeterInfo info;
        ASSERT_TRUE(plugin.Audio().GetMeterInfo(i, info));
        EXPECT_EQ(info.name + " in " + info.unit, std::string(meters[i][0]) + " in " + meters[i][1]);
    }
    // Before any audio: no gain reduction, silence on the level meters.
    EXPECT_EQ(plugin.Meter("Gain Reduction"), 0.0f);
    EXPECT_EQ(plugin.Meter("Output Peak 1"), -30.0f);
}

TEST(ZenLimiter, ReportedLatencyIsTheImpulseDelayAtEveryRateAndBlockSize) {
    for (std::size_t r = 0; r < std::size(kRates); ++r) {
        const float rate = kRates[r];
        const std::uint32_t block = kBlocks[r + 1];
        PluginHarness plugin = Limiter(Settings{}, 1, rate, block);
        const std::uint32_t latency = plugin.Audio().GetLatency();
        // Block, true-peak latency and look-ahead: a few milliseconds.
        EXPECT_LT(latency / rate, 0.007) << rate;
        const std::vector<float> output = plugin.Run(zentest::Impulse(4000, 1000, 0.5f), 1, block)[0];
        EXPECT_EQ(zentest::ArgPeak(output), 1000 + latency) << rate;
        EXPECT_EQ(output[1000 + latency], 0.5f) << rate;
        // Below the ceiling nothing else is touched.
        EXPECT_EQ(zentest::Peak(output, 0, 1000 + latency), 0.0f);
        EXPECT_EQ(zentest::Peak(output, 1001 + latency), 0.0f);
    }
}

TEST(ZenLimiter, QuietSignalsPassUnchangedAndSilenceStaysSilent) {
    const std::vector<float> input = zentest::Noise(6000, 0.4, 5);
    PluginHarness plugin = Limiter(Settings{}, 1, 48000.0f, 512);
    const std::uint32_t latency = plugin.Audio().GetLatency();
    const std::vector<float> output = plugin.Run(input, 1, 512)[0];
    for (std::size_t n = latency; n < output.size(); ++n) ASSERT_EQ(output[n], input[n - latency]) << n;
    EXPECT_EQ(plugin.Meter("Gain Reduction"), 0.0f);

    const std::vector<float> silence = Limit(std::vector<float>(5000, 0.0f), Settings{-24.0f, 18.0f, 0.0f, true});
    EXPECT_EQ(zentest::Peak(silence), 0.0f);
}

TEST(ZenLimiter, LowAndMiddleSinesStayUnderTheCeiling) { ReportClosest(SinesHold({50.0, 1000.0, 5000.0})); }

// fs/4 and fs/3 put the crests where 4x points miss them the most.
TEST(ZenLimiter, HighSinesUpTo15kHzStayUnderTheCeiling) {
    ReportClosest(SinesHold({11025.0, 12000.0, 14700.0, 15000.0}));
}

TEST(ZenLimiter, SquaresImpulsesAndInterSamplePeaksStayUnderTheCeiling) {
    ReportClosest(std::max(
        {ExpectCeilingHolds("square 1 kHz", [](double rate) { return Square(1000.0, rate, kFrames, 1.0); }),
         ExpectCeilingHolds(
             "square 7 kHz", [](double rate) { return Square(7000.0, rate, kFrames, 0.8); }, 6.0f),
         ExpectCeilingHolds("impulses", [](double) { return Impulses(kFrames); }),
         ExpectCeilingHolds("inter-sample peaks", [](double rate) { return InterSamplePeaks(rate, kFrames); })}));
}

TEST(ZenLimiter, NoiseAndMusicLikeMaterialStayUnderTheCeiling) {
    ReportClosest(
        std::max({ExpectCeilingHolds("full-scale noise", [](double) { return zentest::Noise(kFrames, 1.0, 3); }),
                  ExpectCeilingHolds(
                      "full-scale noise +12 dB", [](double) { return zentest::Noise(kFrames, 1.0, 4); }, 12.0f),
                  ExpectCeilingHolds(
                      "music-like", [](double rate) { return MusicLike(rate, kFrames); }, 6.0f)}));
}

TEST(ZenLimiter, WithSoftOnTheCeilingStillHolds) {
    // The soft curve's harmonics put new peaks between samples.
    ReportClosest(std::max(
        {ExpectCeilingHolds(
             "full-scale noise, soft", [](double) { return zentest::Noise(kFrames, 1.0, 5); }, 6.0f, true),
         ExpectCeilingHolds(
             "sine 9 kHz, soft", [](double rate) { return zentest::Sine(9000.0, rate, kFrames, 1.0); }, 6.0f, true),
         ExpectCeilingHolds(
             "square 3 kHz, soft", [](double rate) { return Square(3000.0, rate, kFrames, 1.0); }, 6.0f, true),
         ExpectCeilingHolds(
             "music-like, soft", [](double rate) { return MusicLike(rate, kFrames); }, 6.0f, true)}));
}

TEST(ZenLimiter, SinesAbove15kHzOvershootByLittle) {
    // Between 15 kHz and Nyquist the interpolator's band ends. A steady sine
    // times a steady gain peaks at exactly amplitude x gain, whatever a
    // checker's filter would make of content so close to Nyquist, so the
    // overshoot is taken from the gain the limiter settled on.
    double worst = -100.0;
    std::string where;
    for (float rate : {44100.0f, 48000.0f, 96000.0f}) {
        for (double frequency = 15500.0; frequency<rate / 2; frequency += frequency> rate / 2 - 700.0
                                             ? 100.0
                                             : (rate < 50000.0f ? 1000.0 : 4000.0)) {
            for (double phase : {0.0, 1.1}) {
                Settings settings;
                settings.ceilingDb = -1.0f;
                PluginHarness plugin = Limiter(settings, 1, rate, 512);
                const std::uint32_t latency = plugin.Audio().GetLatency();
                const double amplitude = 1.5;
                const std::vector<float> input = zentest::Sine(frequency, rate, 16000, amplitude, phase);
                const std::vector<float> output = plugin.Run(input, 1, 512)[0];
                double gain = 0.0;
                for (std::size_t n = 12000; n < output.size(); ++n)
                    if (std::fabs(input[n - latency]) > 0.5)
                        gain = std::max(gain, double(output[n] / input[n - latency]));
                const double over = Db(gain * amplitude) - settings.ceilingDb;
                if (over > worst) {
                    worst = over;
                    where = std::to_string(static_cast<int>(frequency)) + " Hz at " +
                            std::to_string(static_cast<int>(rate)) + " Hz";
                }
            }
        }
    }
    std::printf("worst overshoot of steady sines from 15 kHz to Nyquist: %+.3f dB (%s)\n", worst, where.c_str());
    EXPECT_LT(worst, 1.5);
}

TEST(ZenLimiter, LoudSinesSettleAtTheCeilingLessItsMargin) {
    for (float ceiling : {0.0f, -6.0f, -24.0f}) {
        Settings settings;
        settings.ceilingDb = ceiling;
        PluginHarness plugin = Limiter(settings, 1, 48000.0f, 512);
        const std::vector<float> output = plugin.Run(zentest::Sine(440.0, 48000.0, 24000, 2.0), 1, 512)[0];
        // The last 100 ms: steady.
        const std::vector<float> tail(output.end() - 4800, output.end());
        const double peak = Db(zentest::OversampledPeak().Measure(tail, 64, tail.size() - 64));
        EXPECT_NEAR(peak, ceiling - ZenLimiter::kCeilingMarginDb, 0.02) << ceiling;
        // The meters: 6 dB in, the ceiling out, their difference as gain.
        EXPECT_NEAR(plugin.Meter("Input True Peak 1"), 6.02, 0.02);
        EXPECT_NEAR(plugin.Meter("Gain Reduction"), ceiling - ZenLimiter::kCeilingMarginDb - 6.02, 0.03);
        EXPECT_NEAR(plugin.Meter("Output Peak 1"), ceiling - ZenLimiter::kCeilingMarginDb, 0.02);
    }
}

TEST(ZenLimiter, GainNeverExceedsOneAndInputGainApplies) {
    Settings settings;
    settings.ceilingDb = -6.0f;
    settings.inputGainDb = 6.0f;
    settings.releaseMs = 0.0f;
    PluginHarness plugin = Limiter(settings, 1, 48000.0f, 64);
    const std::uint32_t latency = plugin.Audio().GetLatency();
    // Bursts and pauses: the gain drops, releases at the fastest rate, and
    // the quiet stretches come out exactly twice as loud, never louder.
    std::vector<float> input = zentest::Sine(1000.0, 48000.0, 20000, 0.2);
    for (std::size_t n = 5000; n < 6000; ++n) input[n] *= 8.0f;
    for (std::size_t n = 12000; n < 12100; ++n) input[n] *= 8.0f;
    const std::vector<float> output = plugin.Run(input, 1, 64)[0];
    const float gain = std::pow(10.0f, 6.0f / 20.0f);
    for (std::size_t n = latency; n < output.size(); ++n)
        ASSERT_LE(std::fabs(output[n]), std::fabs(input[n - latency] * gain) * 1.000001f) << n;
    for (std::size_t n = 9000; n < 11000; ++n) ASSERT_NEAR(output[n + latency], input[n] * gain, 1e-6f) << n;
}

TEST(ZenLimiter, ReleaseFollowsItsOnePoleLawAndLetsGo) {
    // After a loud burst, a steady quiet level: where the gain moves, the
    // reduction (1 - g) shrinks by c = exp(-1 / (4 max(n, 1))) per sample,
    // n the release time in samples (0 ms counts as one sample); the holds
    // between releases keep the recovery from 0 ms within milliseconds.
    for (float releaseMs : {0.0f, 1.0f, 10.0f}) {
        Settings settings;
        settings.ceilingDb = -12.0f;
        settings.releaseMs = releaseMs;
        std::vector<float> input(30000, 0.05f);
        for (std::size_t n = 1000; n < 1100; ++n) input[n] = 1.0f;
        PluginHarness plugin = Limiter(settings, 1, 48000.0f, 512);
        const std::uint32_t latency = plugin.Audio().GetLatency();
        const std::vector<float> output = plugin.Run(input, 1, 512)[0];
        const double samples = std::max(1.0, std::trunc(48.0 * releaseMs));
        const double c = std::exp(-1.0 / (4.0 * samples));
        int checked = 0;
        const auto reduction = [&](std::size_t n) { return 1.0 - output[n] / 0.05; };
        for (std::size_t n = 1100 + latency; n + 8 < output.size(); ++n) {
            // Inside a stretch of release, away from the holds and the ramp:
            // the reduction falls geometrically over eight samples.
            const double first = reduction(n + 1) / reduction(n), last = reduction(n + 8) / reduction(n + 7);
            if (reduction(n + 8) < 1e-3 || !(first < 1.0 - 1e-5) || std::fabs(first - last) > 1e-5) continue;
            EXPECT_NEAR(reduction(n + 8) / reduction(n), std::pow(c, 8), 1e-3) << releaseMs << " ms at " << n;
            ++checked;
        }
        EXPECT_GT(checked, 5) << releaseMs;
        EXPECT_TRUE(releaseMs > 0.0f || reduction(1100 + latency + 960) < 1.0 - std::pow(10.0, -1.0 / 20.0));
        EXPECT_LT(reduction(output.size() - 1), 1e-3) << releaseMs;
    }
}

TEST(ZenLimiter, SoftShapesOnlyBlocksOverTheCeilingWithItsKnee) {
    // The soft stage changes the waveform (adds harmonics) only when it is
    // on and the block's true peak is over the ceiling, and only samples at
    // or above the knee max(0.25, min(C, 1)).
    auto thd = [](const std::vector<float>& y, std::size_t from, double frequency) {
        // Energy left after removing the best-fitting sine of `frequency`.
        double c = 0, s = 0, total = 0;
        for (std::size_t n = from; n < y.size(); ++n) {
            const double w = 2.0 * kPi * frequency * static_cast<double>(n) / 48000.0;
            c += y[n] * std::cos(w);
            s += y[n] * std::sin(w);
            total += double(y[n]) * y[n];
        }
        const double count = static_cast<double>(y.size() - from);
        const double fundamental = 2.0 * (c * c + s * s) / count;
        return std::max(0.0, total - fundamental) / std::max(total, 1e-30);
    };
    auto run = [](float ceiling, bool soft, double amplitude) {
        Settings settings;
        settings.ceilingDb = ceiling;
        settings.soft = soft;
        return Limit(zentest::Sine(480.0, 48000.0, 48000, amplitude), settings);
    };
    // Off: a limited sine stays a sine.
    EXPECT_LT(thd(run(-6.0f, false, 2.0), 4800, 480.0), 1e-6);
    // On, over the ceiling: rounded crests.
    EXPECT_GT(thd(run(-6.0f, true, 2.0), 4800, 480.0), 1e-3);
    // On, but under the ceiling: untouched.
    EXPECT_LT(thd(run(-6.0f, true, 0.3), 4800, 480.0), 1e-9);
    // Switched on while running: from the next block on.
    {
        Settings settings;
        settings.ceilingDb = -6.0f;
        PluginHarness plugin = Limiter(settings, 1, 48000.0f, 512);
        const std::vector<float> sine = zentest::Sine(480.0, 48000.0, 48000, 2.0);
        std::vector<float> before(sine.begin(), sine.begin() + 24000), after(sine.begin() + 24000, sine.end());
        plugin.Run(before, 1, 512);
        plugin.Set("Soft", 1.0f);
        EXPECT_GT(thd(plugin.Run(after, 1, 512)[0], 4800, 480.0), 1e-3);
    }
    // Ceiling -24 dBTP (C = 0.062): the knee stays at 0.25, so a sine over
    // the ceiling but under the knee is only scaled, one over it is shaped.
    EXPECT_LT(thd(run(-24.0f, true, 0.2), 4800, 480.0), 1e-6);
    EXPECT_GT(thd(run(-24.0f, true, 0.5), 4800, 480.0), 1e-3);

    // The shape itself: a steady block comes out as g * knee * tanh(|x| / knee) / tanh(1).
    Settings settings;
    settings.ceilingDb = -6.0f;
    settings.soft = true;
    PluginHarness plugin = Limiter(settings, 1, 48000.0f, 512);
    const std::uint32_t latency = plugin.Audio().GetLatency();
    const std::vector<float> input = zentest::Sine(480.0, 48000.0, 48000, 2.0);
    const std::vector<float> output = plugin.Run(input, 1, 512)[0];
    const float knee = std::pow(10.0f, (-6.0f - 0.2f) / 20.0f);
    std::vector<double> ratios;
    for (std::size_t n = 40000; n < 40100; ++n) {
        const float x = input[n - latency];
        const float shaped =
            std::fabs(x) >= knee ? std::copysign(knee * std::tanh(std::fabs(x) / knee) / 0.7615942f, x) : x;
        if (std::fabs(shaped) > 0.1f) ratios.push_back(output[n] / shaped);
    }
    for (double r : ratios) EXPECT_NEAR(r, ratios.front(), 1e-5);
    // The gain brings the shaped block's largest sample to the ceiling.
    EXPECT_NEAR(ratios.front() * knee / 0.7615942 * std::tanh(2.0 / knee), knee, 0.01);
}

// NaN and infinities arrive as silence and huge values at +200 dBFS: the
// output stays finite and under the ceiling through all of them.
TEST(ZenLimiter, NonFiniteAndHugeInputStayUnderTheCeiling) {
    std::vector<float> input = zentest::Noise(9600, 0.5, 7);
    input[1000] = NAN;
    input[2000] = INFINITY;
    input[3000] = -INFINITY;
    std::fill(input.begin() + 4000, input.begin() + 4100, 1e19f);
    std::fill(input.begin() + 6000, input.begin() + 6100, -3e38f);
    const std::vector<float> output = Limit(input, {});
    for (std::size_t n = 0; n < output.size(); ++n) {
        ASSERT_TRUE(std::isfinite(output[n])) << n;
        ASSERT_LE(std::fabs(output[n]), 1.0f) << n;
    }
}

TEST(ZenLimiter, AnyBlockSplitGivesTheSameOutputAndResetReproduces) {
    Settings settings;
    settings.ceilingDb = -3.0f;
    settings.soft = true;
    const std::vector<float> input = MusicLike(48000.0, 20000);
    const std::vector<float> whole = Limit(input, settings, 48000.0f, 20000);
    for (std::uint32_t block : {1u, 7u, 256u, 8192u})
        EXPECT_EQ(Limit(input, settings, 48000.0f, block), whole) << block;

    PluginHarness plugin = Limiter(settings, 1, 48000.0f, 512);
    plugin.Run(zentest::Noise(9000, 1.0, 2), 1, 512);
    plugin.Audio().Reset();
    EXPECT_EQ(plugin.Run(input, 1, 512)[0], whole);
}

TEST(ZenLimiter, StereoSharesOneGainAndAChannelChangeResets) {
    // A loud left channel pulls the quiet right channel down with it.
    Settings settings;
    settings.ceilingDb = -6.0f;
    PluginHarness plugin = Limiter(settings, 2, 48000.0f, 512);
    const std::uint32_t latency = plugin.Audio().GetLatency();
    Channels io = {zentest::Sine(300.0, 48000.0, 9600, 1.0), zentest::Sine(300.0, 48000.0, 9600, 0.1)};
    const Channels input = io;
    plugin.Process(io, 512);
    for (std::size_t n = 4800; n < 9600; ++n) {
        if (std::fabs(input[0][n - latency]) < 0.5f) continue;
        ASSERT_NEAR(io[0][n] / input[0][n - latency], io[1][n] / input[1][n - latency], 1e-5) << n;
    }
    EXPECT_LT(plugin.Meter("Gain Reduction"), -5.0f);
    // One channel now: everything starts afresh.
    ASSERT_TRUE(plugin.Audio().ConfigureChannels(1, 1));
    EXPECT_EQ(plugin.Meter("Gain Reduction"), 0.0f);
    EXPECT_EQ(plugin.Audio().GetMeterCount(), 3u);
    const std::vector<float> after = plugin.Run(zentest::Sine(300.0, 48000.0, 2000, 0.1), 1, 512)[0];
    EXPECT_EQ(zentest::Peak(after, 0, latency), 0.0f);
}
