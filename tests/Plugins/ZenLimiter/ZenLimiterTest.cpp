// "Limiter" through the host interface: sample for sample against the
// independent statement of its law (Support/LimiterModel) at every rate, with
// settled and moving input gain and ceiling and random block splits; the
// latency against an impulse; the table and meters hosts see; what a
// listener hears (the true peak with Soft off, the soft stage's harmonics);
// reset and channel changes. The law itself, in every mode, is the
// algorithm's test (Common/Algorithms/LimiterTest).
#include <gtest/gtest.h>

#include <cmath>
#include <random>
#include <string>

#include "Plugins/ZenLimiter/ZenLimiter.h"
#include "Support/LimiterModel.h"
#include "Support/OversampledPeak.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::Channels;
using zentest::PluginHarness;

namespace {

using zentest::kPi;

struct Settings {
    float rate = 48000.0f;
    float ceilingDb = 0.0f;
    float inputGainDb = 0.0f;
    float releaseMs = 1.0f;
    bool soft = false;
};

PluginHarness LimiterPlugin(const Settings& settings, std::uint32_t channels = 1, std::uint32_t block = 512) {
    return zentest::Prepared("Limiter",
                             {{"Ceiling", settings.ceilingDb}, {"Input Gain", settings.inputGainDb},
                              {"Release", settings.releaseMs}, {"Soft", settings.soft ? 1.0f : 0.0f}},
                             channels, settings.rate, block);
}

std::vector<float> Limit(const std::vector<float>& input, const Settings& settings, std::uint32_t block = 512) {
    PluginHarness plugin = LimiterPlugin(settings, 1, block);
    return plugin.Run(input, 1, block)[0];
}

// In place, in blocks of random length from 1 to maxBlock.
void Stream(PluginHarness& plugin, Channels& io, std::size_t maxBlock, unsigned seed) {
    std::mt19937 random(seed);
    std::uniform_int_distribution<std::size_t> length(1, maxBlock);
    std::vector<float*> pointers(io.size());
    for (std::size_t done = 0; done < io[0].size();) {
        const std::size_t n = std::min(io[0].size() - done, length(random));
        for (std::size_t c = 0; c < io.size(); ++c) pointers[c] = io[c].data() + done;
        ASSERT_TRUE(plugin.Audio().Process(pointers.data(), n));
        done += n;
    }
}

float Gain(float db) { return static_cast<float>(std::pow(10.0, db / 20.0)); }

// The shared 200 ms one-pole every smoothed parameter follows while audio
// runs, from `from` toward `to`, one value per sample.
std::vector<double> Ramp(double rate, double from, float to, std::size_t frames) {
    const double a = std::min(std::exp(-2.0 * kPi / (200 * rate * 0.001)), 1.0), b = 1.0 - a;
    std::vector<double> values(frames);
    double current = from;
    for (double& v : values) v = current = a * current + b * static_cast<double>(to);
    return values;
}

zentest::LimiterModel Model(const Settings& settings) {
    zentest::LimiterModel model;
    model.sampleRate = settings.rate;
    model.ceilingDb = settings.ceilingDb;
    model.releaseMs = settings.releaseMs;
    model.soft = settings.soft;
    return model;
}

// Loud stereo material: music on the left, bursts of noise on the right.
Channels Material(double rate, std::size_t frames) {
    Channels x = {zentest::MusicLike(rate, frames), zentest::Noise(frames, 0.3, 9)};
    for (std::size_t n = 0; n < frames; ++n)
        if ((n / 3000) % 3 == 1) x[1][n] *= 4.0f;
    return x;
}

void ExpectSameSamples(const Channels& output, const Channels& expected, const std::string& where) {
    for (std::size_t c = 0; c < output.size(); ++c) {
        std::size_t differences = 0, first = SIZE_MAX;
        for (std::size_t n = 0; n < output[c].size(); ++n)
            if (output[c][n] != expected[c][n]) {
                ++differences;
                first = std::min(first, n);
            }
        EXPECT_EQ(differences, 0u) << where << ", channel " << c << ": first at " << first;
    }
}

// Energy left after removing the best-fitting sine of `frequency`, relative.
double Distortion(const std::vector<float>& y, std::size_t from, double frequency, double rate) {
    double c = 0, s = 0, total = 0;
    for (std::size_t n = from; n < y.size(); ++n) {
        const double w = 2.0 * kPi * frequency * static_cast<double>(n) / rate;
        c += y[n] * std::cos(w);
        s += y[n] * std::sin(w);
        total += static_cast<double>(y[n]) * y[n];
    }
    const double fundamental = 2.0 * (c * c + s * s) / static_cast<double>(y.size() - from);
    return std::max(0.0, total - fundamental) / std::max(total, 1e-30);
}

constexpr float kRates[] = {44100.0f, 48000.0f, 96000.0f, 192000.0f};

}  // namespace

TEST(ZenLimiter, ParametersAndMetersAsHostsSeeThem) {
    PluginHarness plugin("Limiter");
    struct Row {
        const char* identifier;
        const char* label;
        float minimum, maximum, defaultValue, step;
        const char* unit;
    };
    const Row rows[] = {{"ZenLimiter::INPUT_GAIN", "Input Gain", -18, 18, 0, 0.1f, "dB"},
                        {"ZenLimiter::THRESHOLD", "Ceiling", -24, 0, 0, 0.1f, "dBTP"},
                        {"ZenLimiter::RELEASE", "Release", 0, 1000, 1, 0.01f, "ms"},
                        {"ZenLimiter::SOFT", "Soft", 0, 1, 0, 1, ""}};
    ASSERT_EQ(plugin.Audio().GetParameterCount(), 4u);
    for (std::uint32_t i = 0; i < 4; ++i) {
        zen::ParameterInfo info;
        ASSERT_TRUE(plugin.Audio().GetParameterInfo(i, info));
        EXPECT_EQ(info.identifier, rows[i].identifier);
        EXPECT_EQ(info.label, rows[i].label);
        EXPECT_EQ(info.unit, rows[i].unit) << info.label;
        EXPECT_EQ(info.minimum, rows[i].minimum) << info.label;
        EXPECT_EQ(info.maximum, rows[i].maximum) << info.label;
        EXPECT_EQ(info.defaultValue, rows[i].defaultValue) << info.label;
        EXPECT_EQ(info.step, rows[i].step) << info.label;
        EXPECT_EQ(info.kind, i == ZenLimiter::kSoft ? zen::ParameterKind::Switch : zen::ParameterKind::Continuous);
        EXPECT_EQ(plugin.Audio().GetParameter(i), rows[i].defaultValue) << info.label;
    }
    EXPECT_FALSE(plugin.Audio().SetParameter(4, 0.0f));

    plugin.Prepare(2);
    const char* meters[][2] = {{"Gain Reduction", "dB"}, {"Input True Peak 1", "dBTP"}, {"Output Peak 1", "dBFS"},
                               {"Input True Peak 2", "dBTP"}, {"Output Peak 2", "dBFS"}};
    ASSERT_EQ(plugin.Audio().GetMeterCount(), 5u);
    for (std::uint32_t i = 0; i < 5; ++i) {
        zen::MeterInfo info;
        ASSERT_TRUE(plugin.Audio().GetMeterInfo(i, info));
        EXPECT_EQ(info.name + " in " + info.unit, std::string(meters[i][0]) + " in " + meters[i][1]);
        EXPECT_EQ(info.minimum, i == 0 ? -24.0f : -30.0f) << info.name;
    }
    // At rest: no gain reduction, silence on the level meters.
    EXPECT_EQ(plugin.Meter("Gain Reduction"), 0.0f);
    EXPECT_EQ(plugin.Meter("Input True Peak 2"), -30.0f);
    EXPECT_EQ(plugin.Meter("Output Peak 1"), -30.0f);

    // A peak of 1e38 arrives held at 1e10 (+200 dBFS): the meter reads the
    // gain that takes it under the ceiling, far below its scale but finite.
    Channels io(2, std::vector<float>(500, 0.0f));  // ends in the hold
    io[0][10] = 1e38f;
    plugin.Process(io, 512);
    EXPECT_NEAR(plugin.Meter("Gain Reduction"), -200.2f, 0.05f);
}

TEST(ZenLimiter, LatencyIsTheImpulseDelayAndQuietMaterialPassesExactly) {
    // Block (two holds of 4 (L + D)), true-peak latency L = 24 and look-ahead
    // D = max(L, 0.5 ms): 9 ms at 44.1 kHz, 5.6 ms at 192 kHz.
    const std::uint32_t expected[] = {432, 432, 648, 1080};
    const std::uint32_t blocks[] = {37, 512, 4096, 1};
    for (std::size_t r = 0; r < std::size(kRates); ++r) {
        Settings settings;
        settings.rate = kRates[r];
        PluginHarness plugin = LimiterPlugin(settings, 1, blocks[r]);
        const std::uint32_t latency = plugin.Audio().GetLatency();
        EXPECT_EQ(latency, expected[r]) << kRates[r];
        const std::vector<float> output = plugin.Run(zentest::Impulse(2500, 1000, 0.5f), 1, blocks[r])[0];
        EXPECT_EQ(zentest::ArgPeak(output), 1000 + latency) << kRates[r];
        EXPECT_EQ(output[1000 + latency], 0.5f) << kRates[r];
        EXPECT_EQ(zentest::Peak(output, 0, 1000 + latency) + zentest::Peak(output, 1001 + latency), 0.0f);
    }
    const std::vector<float> input = zentest::Noise(6000, 0.4, 5);
    PluginHarness plugin = LimiterPlugin(Settings{});
    const std::vector<float> output = plugin.Run(input, 1, 512)[0];
    for (std::size_t n = 432; n < output.size(); ++n) ASSERT_EQ(output[n], input[n - 432]) << n;
    EXPECT_EQ(plugin.Meter("Gain Reduction"), 0.0f);
}

TEST(ZenLimiter, MatchesItsLawSampleForSampleAtEveryRateAndSplit) {
    const Settings table[] = {
        {44100.0f, -1.0f, 6.0f, 1.0f, false}, {48000.0f, -6.0f, 12.0f, 0.0f, true},
        {96000.0f, -0.3f, 3.0f, 20.0f, true}, {192000.0f, -12.0f, 0.0f, 0.5f, false},
    };
    std::size_t maxBlock = 3;
    for (const Settings& settings : table) {
        const Channels input = Material(settings.rate, 12000);
        PluginHarness plugin = LimiterPlugin(settings, 2);
        const zentest::LimiterModel model = Model(settings);
        EXPECT_EQ(plugin.Audio().GetLatency(), model.Latency());
        Channels amplified = input;
        for (auto& channel : amplified)
            for (float& x : channel) x *= Gain(settings.inputGainDb);
        Channels output = input;
        Stream(plugin, output, maxBlock, 11);
        ExpectSameSamples(output, model.Run(amplified),
                          std::to_string(settings.rate) + " Hz, ceiling " + std::to_string(settings.ceilingDb) +
                              ", soft " + std::to_string(settings.soft) + ", blocks up to " + std::to_string(maxBlock));
        maxBlock = maxBlock * 9 + 5;  // 3, 32, 293, 2642
    }
}

TEST(ZenLimiter, MatchesItsLawWhileInputGainAndCeilingGlide) {
    // Both move with the shared 200 ms smoother from the block after the
    // change, per sample, until they settle (about a second) and on after.
    for (const auto& [rate, soft] : {std::pair{48000.0f, true}, {44100.0f, false}}) {
        Settings settings;
        settings.rate = rate;
        settings.ceilingDb = -1.0f;
        settings.soft = soft;
        const std::size_t before = 2048, frames = 2 * static_cast<std::size_t>(rate);
        const Channels input = Material(rate, frames);
        PluginHarness plugin = LimiterPlugin(settings, 2, 256);

        Channels first(2), second(2);
        for (std::size_t c = 0; c < 2; ++c) {
            first[c].assign(input[c].begin(), input[c].begin() + before);
            second[c].assign(input[c].begin() + before, input[c].end());
        }
        plugin.Process(first, 256);
        plugin.Set("Input Gain", 9.0f);
        plugin.Set("Ceiling", -7.5f);
        Stream(plugin, second, 700, 5);

        const std::vector<double> gain = Ramp(rate, 1.0, Gain(9.0f), frames - before);
        const std::vector<double> ceiling = Ramp(rate, Limiter::CeilingGain(-1.0f), Limiter::CeilingGain(-7.5f),
                                                 frames - before);
        zentest::LimiterModel model = Model(settings);
        model.ceiling.assign(before, Limiter::CeilingGain(-1.0f));
        Channels amplified = input;
        for (std::size_t n = before; n < frames; ++n) {
            model.ceiling.push_back(static_cast<float>(ceiling[n - before]));
            for (auto& channel : amplified) channel[n] *= static_cast<float>(gain[n - before]);
        }
        const Channels expected = model.Run(amplified);
        Channels output(2);
        for (std::size_t c = 0; c < 2; ++c) {
            output[c] = first[c];
            output[c].insert(output[c].end(), second[c].begin(), second[c].end());
        }
        ExpectSameSamples(output, expected, std::to_string(rate) + " Hz, soft " + std::to_string(soft));
        // Settled at the end: the gain is the setting's, to the float.
        EXPECT_EQ(static_cast<float>(gain.back()), Gain(9.0f));
    }
}

TEST(ZenLimiter, WithSoftOffTheTruePeakStaysUnderTheCeiling) {
    // An independent 16x reading of the output, 0.2 dB of margin below the
    // setting taken by the law; the closest approach is printed.
    static const zentest::OversampledPeak check;
    double closest = -100.0;
    std::string where;
    const auto expectUnder = [&](const std::string& name, const std::vector<float>& input, const Settings& settings) {
        const std::vector<float> output = Limit(input, settings, 512);
        const double peak =
            zentest::ToDb(check.Measure(output, 0, output.size() - zentest::OversampledPeak::kHalfWidth));
        EXPECT_LE(peak, settings.ceilingDb) << name << " at " << settings.rate << " Hz, ceiling "
                                            << settings.ceilingDb;
        if (peak - settings.ceilingDb > closest) {
            closest = peak - settings.ceilingDb;
            where = name + " at " + std::to_string(static_cast<int>(settings.rate)) + " Hz";
        }
    };
    const float ceilings[] = {0.0f, -1.0f, -12.0f, -24.0f};
    for (std::size_t r = 0; r < std::size(kRates); ++r) {
        Settings settings;
        settings.rate = kRates[r];
        settings.ceilingDb = ceilings[r];
        settings.releaseMs = r % 2 == 0 ? 0.0f : 5.0f;
        const double rate = kRates[r];
        std::vector<float> square(6000), pairs(6000, 0.0f);
        for (std::size_t n = 0; n < square.size(); ++n)
            square[n] = (n * 2 * 3500 / static_cast<std::size_t>(rate)) % 2 ? 1.0f : -1.0f;
        // Neighbouring full-scale samples peak 2.1 dB above them, halfway.
        for (std::size_t n = 300; n + 1 < pairs.size(); n += 701) pairs[n] = pairs[n + 1] = n % 2 ? 1.0f : -1.0f;
        expectUnder("noise +12 dB", zentest::Noise(6000, 4.0, 4), settings);
        std::vector<float> music = zentest::MusicLike(rate, 6000);
        for (float& x : music) x *= 2.0f;
        expectUnder("music-like +6 dB", music, settings);
        expectUnder("square 3.5 kHz", square, settings);
        expectUnder("sample pairs", pairs, settings);
        expectUnder("sine fs/4 at 45 degrees", zentest::Sine(rate / 4, rate, 6000, 1.4, kPi / 4), settings);
    }
    std::printf("closest approach to the ceiling: %+.3f dB (%s)\n", closest, where.c_str());
}

TEST(ZenLimiter, WithSoftOffSteadySinesUpToNyquistSettleUnderTheCeiling) {
    // A steady sine times a steady gain peaks at its amplitude times the
    // gain, wherever its crests fall between samples.
    double worst = -100.0;
    std::string where;
    for (float rate : {44100.0f, 48000.0f}) {
        for (double frequency : {1000.0, 11025.0, 15000.0, 17000.0, 19000.0, 20000.0, 21000.0}) {
            if (frequency > 0.45 * rate) continue;
            Settings settings;
            settings.rate = rate;
            settings.ceilingDb = -1.0f;
            PluginHarness plugin = LimiterPlugin(settings);
            const std::uint32_t latency = plugin.Audio().GetLatency();
            const double amplitude = 1.5;
            const std::vector<float> input = zentest::Sine(frequency, rate, 8000, amplitude, 1.1);
            const std::vector<float> output = plugin.Run(input, 1, 512)[0];
            double gain = 0.0;
            for (std::size_t n = 6000; n < output.size(); ++n)
                if (std::fabs(input[n - latency]) > 0.5f)
                    gain = std::max(gain, static_cast<double>(output[n] / input[n - latency]));
            const double over = zentest::ToDb(gain * amplitude) - settings.ceilingDb;
            EXPECT_LT(over, 0.0) << frequency << " Hz at " << rate << " Hz";
            if (over > worst) {
                worst = over;
                where = std::to_string(static_cast<int>(frequency)) + " Hz at " + std::to_string(static_cast<int>(rate));
            }
        }
    }
    std::printf("closest approach of steady sines to the ceiling: %+.3f dB (%s)\n", worst, where.c_str());
}

TEST(ZenLimiter, LoudSinesSettleAtTheCeilingAndTheMetersReadIt) {
    for (float ceiling : {0.0f, -6.0f, -24.0f}) {
        Settings settings;
        settings.ceilingDb = ceiling;
        PluginHarness plugin = LimiterPlugin(settings);
        const std::vector<float> output = plugin.Run(zentest::Sine(440.0, 48000.0, 12000, 2.0), 1, 512)[0];
        const std::vector<float> tail(output.end() - 4800, output.end());
        const double margin = 0.2;
        EXPECT_NEAR(zentest::ToDb(zentest::OversampledPeak().Measure(tail, 64, tail.size() - 64)),
                    ceiling - margin, 0.02)
            << ceiling;
        // 6 dB in, the ceiling less its margin out, their difference as gain.
        EXPECT_NEAR(plugin.Meter("Input True Peak 1"), 6.02, 0.02);
        EXPECT_NEAR(plugin.Meter("Gain Reduction"), ceiling - margin - 6.02, 0.03);
        EXPECT_NEAR(plugin.Meter("Output Peak 1"), ceiling - margin, 0.02);
    }
}

TEST(ZenLimiter, InputGainAppliesAndTheGainNeverExceedsOne) {
    Settings settings;
    settings.ceilingDb = -6.0f;
    settings.inputGainDb = 6.0f;
    settings.releaseMs = 0.0f;
    PluginHarness plugin = LimiterPlugin(settings, 1, 64);
    const std::uint32_t latency = plugin.Audio().GetLatency();
    // Bursts and pauses: the gain drops, releases at the fastest rate, and
    // the quiet stretches come out exactly twice as loud, never louder.
    std::vector<float> input = zentest::Sine(1000.0, 48000.0, 20000, 0.2);
    for (std::size_t n = 5000; n < 6000; ++n) input[n] *= 8.0f;
    for (std::size_t n = 12000; n < 12100; ++n) input[n] *= 8.0f;
    const std::vector<float> output = plugin.Run(input, 1, 64)[0];
    const float gain = Gain(6.0f);
    for (std::size_t n = latency; n < output.size(); ++n)
        ASSERT_LE(std::fabs(output[n]), std::fabs(input[n - latency] * gain)) << n;
    for (std::size_t n = 9000; n < 11000; ++n)
        ASSERT_NEAR(output[n + latency], input[n] * gain, 1e-6f * std::fabs(input[n])) << n;
}

TEST(ZenLimiter, SoftRoundsOnlyBlocksOverTheCeilingAboveItsKnee) {
    const auto run = [](float ceiling, bool soft, double amplitude) {
        Settings settings;
        settings.ceilingDb = ceiling;
        settings.soft = soft;
        return Distortion(Limit(zentest::Sine(480.0, 48000.0, 24000, amplitude), settings), 4800, 480.0, 48000.0);
    };
    // Off: a limited sine stays a sine. On, over the ceiling: rounded crests.
    EXPECT_LT(run(-6.0f, false, 2.0), 1e-6);
    EXPECT_GT(run(-6.0f, true, 2.0), 1e-3);
    // On, but under the ceiling: untouched.
    EXPECT_LT(run(-6.0f, true, 0.3), 1e-9);
    // At -24 dBTP (C = 0.062) the knee stays at 0.25: a sine over the
    // ceiling but under the knee is only scaled, one over it is shaped.
    EXPECT_LT(run(-24.0f, true, 0.2), 1e-6);
    EXPECT_GT(run(-24.0f, true, 0.5), 1e-3);

    // Switched on while running: it reaches the limiter.
    Settings settings;
    settings.ceilingDb = -6.0f;
    PluginHarness plugin = LimiterPlugin(settings);
    const std::vector<float> sine = zentest::Sine(480.0, 48000.0, 24000, 2.0);
    plugin.Run(std::vector<float>(sine.begin(), sine.begin() + 12000), 1, 512);
    plugin.Set("Soft", 1.0f);
    const std::vector<float> after = plugin.Run(std::vector<float>(sine.begin() + 12000, sine.end()), 1, 512)[0];
    EXPECT_GT(Distortion(after, 2400, 480.0, 48000.0), 1e-3);
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

TEST(ZenLimiter, StereoSharesOneGainResetReproducesAndAChannelChangeStartsAfresh) {
    // A loud left channel pulls the quiet right channel down with it.
    Settings settings;
    settings.ceilingDb = -6.0f;
    PluginHarness plugin = LimiterPlugin(settings, 2);
    const std::uint32_t latency = plugin.Audio().GetLatency();
    const Channels input = {zentest::Sine(300.0, 48000.0, 9600, 1.0), zentest::Sine(300.0, 48000.0, 9600, 0.1)};
    Channels io = input;
    plugin.Process(io, 512);
    for (std::size_t n = 4800; n < 9600; ++n) {
        if (std::fabs(input[0][n - latency]) < 0.5f) continue;
        ASSERT_NEAR(io[0][n] / input[0][n - latency], io[1][n] / input[1][n - latency], 1e-5) << n;
    }
    EXPECT_LT(plugin.Meter("Gain Reduction"), -5.0f);

    plugin.Audio().Reset();
    EXPECT_EQ(plugin.Meter("Gain Reduction"), 0.0f);
    Channels again = input;
    plugin.Process(again, 300);
    EXPECT_EQ(again, io);

    ASSERT_TRUE(plugin.Audio().ConfigureChannels(1, 1));
    EXPECT_EQ(plugin.Meter("Gain Reduction"), 0.0f);
    EXPECT_EQ(plugin.Audio().GetMeterCount(), 3u);
    const std::vector<float> after = plugin.Run(zentest::Sine(300.0, 48000.0, 2000, 0.1), 1, 512)[0];
    EXPECT_EQ(zentest::Peak(after, 0, latency), 0.0f);
}
