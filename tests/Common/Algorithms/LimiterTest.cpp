// Limiter: sample for sample against an independent statement of its law
// (Support/LimiterModel) in every mode, rate and block split; then what the
// law guarantees whatever the material: sample peaks under the ceiling, the
// gain never above 1, quiet material passed exactly, the latency, meters,
// and recovery from non-finite input.
#include <gtest/gtest.h>

#include <cmath>
#include <random>

#include "Common/Algorithms/Limiter.h"
#include "Support/LimiterModel.h"
#include "Support/Signals.h"

namespace {

using Channels = std::vector<std::vector<float>>;

struct Settings {
    float rate = 48000.0f;
    float ceilingDb = 0.0f;
    float releaseMs = 1.0f;
    bool soft = false;
};

std::unique_ptr<Limiter> Make(const Settings& settings, std::size_t channels) {
    auto limiter = std::make_unique<Limiter>();
    limiter->SetChannelCount(channels);
    limiter->Prepare(settings.rate, 512);
    limiter->SetParameter(Limiter::kCeiling, settings.ceilingDb);
    limiter->SetParameter(Limiter::kRelease, settings.releaseMs);
    limiter->SetParameter(Limiter::kSoft, settings.soft ? 1.0f : 0.0f);
    return limiter;
}

// Runs in blocks of random length up to maxBlock (1: sample by sample).
// `ceiling`: C per sample; `constant`: one C for every call.
Channels Limit(Limiter& limiter, Channels io, std::size_t maxBlock, unsigned seed = 1,
             const std::vector<float>* ceiling = nullptr, const float* constant = nullptr) {
    std::mt19937 random(seed);
    std::uniform_int_distribution<std::size_t> length(1, maxBlock);
    std::vector<float*> pointers(io.size());
    for (std::size_t done = 0; done < io[0].size();) {
        const std::size_t n = std::min(io[0].size() - done, length(random));
        for (std::size_t c = 0; c < io.size(); ++c) pointers[c] = io[c].data() + done;
        if (ceiling != nullptr)
            EXPECT_TRUE(limiter.Process(pointers.data(), n, ceiling->data() + done));
        else if (constant != nullptr)
            EXPECT_TRUE(limiter.Process(pointers.data(), n, *constant));
        else
            EXPECT_TRUE(limiter.Process(pointers.data(), n));
        done += n;
    }
    return io;
}

zentest::LimiterModel Model(const Settings& settings) {
    zentest::LimiterModel model;
    model.sampleRate = settings.rate;
    model.ceilingDb = settings.ceilingDb;
    model.releaseMs = settings.releaseMs;
    model.soft = settings.soft;
    return model;
}

// Loud stereo material: bursts of noise and a sine near Nyquist over a low
// tone, with pauses, so the gain drops, holds and releases often.
Channels Material(double rate, std::size_t frames, double level) {
    Channels x(2, std::vector<float>(frames, 0.0f));
    const std::vector<float> noise = zentest::Noise(frames, 1.0, 11);
    const std::vector<float> high = zentest::Sine(0.45 * rate, rate, frames, 1.0, 0.3);
    const std::vector<float> low = zentest::Sine(110.0, rate, frames, 0.5);
    for (std::size_t n = 0; n < frames; ++n) {
        const std::size_t phase = n % 6000;
        const double burst = phase < 1500 ? 1.0 : (phase < 3000 ? 0.1 : 0.0);
        x[0][n] = static_cast<float>(level * (low[n] + burst * noise[n]));
        x[1][n] = static_cast<float>(level * (0.3 * low[n] + (phase >= 3000 && phase < 4000 ? high[n] : 0.0)));
    }
    return x;
}

std::size_t CountDifferences(const Channels& a, const Channels& b, std::size_t* first) {
    std::size_t count = 0;
    *first = SIZE_MAX;
    for (std::size_t c = 0; c < a.size(); ++c)
        for (std::size_t n = 0; n < a[c].size(); ++n)
            if (a[c][n] != b[c][n] && !(std::isnan(a[c][n]) && std::isnan(b[c][n]))) {
                ++count;
                *first = std::min(*first, n);
            }
    return count;
}

}  // namespace

TEST(Limiter, MatchesItsLawSampleForSampleInEveryModeRateAndSplit) {
    const Settings table[] = {
        {48000.0f, 0.0f, 1.0f, false},   {48000.0f, -6.0f, 0.0f, true},  {44100.0f, -1.0f, 10.0f, false},
        {44100.0f, -24.0f, 1.0f, true},  {96000.0f, -3.0f, 50.0f, true}, {192000.0f, -12.0f, 0.3f, false},
    };
    std::size_t maxBlock = 1;
    for (const Settings& settings : table) {
        const Channels input = Material(settings.rate, 20000, 2.0);
        auto limiter = Make(settings, 2);
        const zentest::LimiterModel model = Model(settings);
        EXPECT_EQ(limiter->GetLatency(), model.Latency()) << settings.rate;
        const Channels expected = model.Run(input);
        std::size_t first = 0;
        const std::size_t differences = CountDifferences(Limit(*limiter, input, maxBlock, 3), expected, &first);
        EXPECT_EQ(differences, 0u) << settings.rate << " Hz, ceiling " << settings.ceilingDb << ", release "
                                   << settings.releaseMs << ", soft " << settings.soft << ", blocks up to " << maxBlock
                                   << ": first at " << first;
        maxBlock = maxBlock * 7 + 3;  // 1, 10, 73, 514, ...
    }
}

TEST(Limiter, ACeilingGivenPerSampleIsTakenWhereEachBlockIsDecided) {
    Settings settings;
    settings.soft = true;
    const Channels input = Material(48000.0, 12000, 1.5);
    std::vector<float> ceiling(12000);
    for (std::size_t n = 0; n < ceiling.size(); ++n) ceiling[n] = 0.2f + 0.6f * static_cast<float>(n) / 12000.0f;
    zentest::LimiterModel model = Model(settings);
    model.ceiling = ceiling;
    auto limiter = Make(settings, 2);
    std::size_t first = 0;
    EXPECT_EQ(CountDifferences(Limit(*limiter, input, 300, 5, &ceiling), model.Run(input), &first), 0u) << first;

    // One ceiling for every call: as the parameter set to it.
    const float constant = Limiter::CeilingGain(-4.0f);
    auto byParameter = Make({48000.0f, -4.0f, 1.0f, true}, 2);
    limiter->Reset();
    EXPECT_EQ(CountDifferences(Limit(*limiter, input, 300, 5, nullptr, &constant),
                               Limit(*byParameter, input, 300, 5), &first),
              0u)
        << first;
}

TEST(Limiter, SamplePeaksStayUnderTheCeilingAndTheGainUnderOne) {
    // What the law guarantees for any material: every output sample is the
    // input times a gain no larger than C over its block's peak.
    for (bool soft : {false, true}) {
        for (float ceilingDb : {0.0f, -1.0f, -24.0f}) {
            Settings settings;
            settings.ceilingDb = ceilingDb;
            settings.releaseMs = 0.0f;
            settings.soft = soft;
            auto limiter = Make(settings, 2);
            Channels input = Material(48000.0, 24000, 4.0);  // +12 dB
            for (float& x : input[1]) x = -x * 1.7f;
            const Channels output = Limit(*limiter, input, 512);
            const float bound = Limiter::CeilingGain(ceilingDb) * (1.0f + 1e-6f);
            for (const auto& channel : output) EXPECT_LE(zentest::Peak(channel), bound) << ceilingDb << " " << soft;
            EXPECT_LE(limiter->GetGain(), 1.0f);
            EXPECT_LT(limiter->GetMeter(Limiter::kGainMeter), 0.0f);
        }
    }
}

TEST(Limiter, QuietMaterialPassesExactlyDelayedAndSilenceStaysSilent) {
    for (float rate : {44100.0f, 48000.0f, 96000.0f, 192000.0f}) {
        auto limiter = Make({rate, -1.0f, 1.0f, true}, 1);
        const std::uint32_t latency = limiter->GetLatency();
        // Block + true-peak latency + look-ahead, no shorter than that latency.
        EXPECT_EQ(latency, limiter->GetBlockLength() + limiter->GetTruePeakLatency() + limiter->GetLookAheadLength());
        EXPECT_GE(limiter->GetLookAheadLength(), limiter->GetTruePeakLatency());
        EXPECT_LT(latency / rate, 0.010) << rate;
        const std::vector<float> input = zentest::Noise(6000, 0.5, 5);
        const Channels output = Limit(*limiter, {input}, 700);
        for (std::size_t n = 0; n < latency; ++n) ASSERT_EQ(output[0][n], 0.0f) << n;
        for (std::size_t n = latency; n < input.size(); ++n) ASSERT_EQ(output[0][n], input[n - latency]) << n;
        EXPECT_EQ(limiter->GetMeter(Limiter::kGainMeter), 0.0f);
    }
    auto limiter = Make({48000.0f, -24.0f, 0.0f, true}, 2);
    const Channels silence = Limit(*limiter, Channels(2, std::vector<float>(5000, 0.0f)), 512);
    EXPECT_EQ(zentest::Peak(silence[0]) + zentest::Peak(silence[1]), 0.0f);
    EXPECT_EQ(limiter->GetGain(), 1.0f);
}

TEST(Limiter, MetersReadTheGainAndEachChannelsInputTruePeak) {
    auto limiter = Make({48000.0f, -6.0f, 1.0f, false}, 2);
    Limit(*limiter, {zentest::Sine(440.0, 48000.0, 24000, 2.0), zentest::Sine(440.0, 48000.0, 24000, 0.5)}, 512);
    EXPECT_NEAR(limiter->GetMeter(Limiter::InputTruePeakMeter(0)), 6.02, 0.02);
    EXPECT_NEAR(limiter->GetMeter(Limiter::InputTruePeakMeter(1)), -6.02, 0.02);
    // The loud channel is brought to the ceiling less its margin, the other follows.
    EXPECT_NEAR(limiter->GetMeter(Limiter::kGainMeter), -6.2 - 6.02, 0.03);
    EXPECT_NEAR(limiter->GetMeter(Limiter::OutputPeakMeter(0)), -6.2, 0.03);
    EXPECT_NEAR(limiter->GetMeter(Limiter::OutputPeakMeter(1)), -6.2 - 12.04, 0.03);
    EXPECT_EQ(limiter->GetMeter(Limiter::InputTruePeakMeter(2)), 0.0f);
    limiter->Reset();
    EXPECT_EQ(limiter->GetGain(), 1.0f);
    EXPECT_EQ(limiter->GetInputTruePeak(0), 0.0f);
    EXPECT_EQ(limiter->GetOutputPeak(1), 0.0f);
}

TEST(Limiter, ResetReproducesAndNonFiniteInputDoesNotStick) {
    const Channels input = Material(48000.0, 12000, 2.0);
    auto limiter = Make({48000.0f, -3.0f, 5.0f, true}, 2);
    const Channels first = Limit(*limiter, input, 512);
    Channels poisoned = input;
    poisoned[0][100] = NAN;
    poisoned[1][200] = INFINITY;
    poisoned[0][300] = -INFINITY;
    Limit(*limiter, poisoned, 512);
    limiter->Reset();
    EXPECT_EQ(Limit(*limiter, input, 512), first);

    // Without a reset, the stream is finite again once the delays have passed
    // and the gain has released.
    Limit(*limiter, poisoned, 512);
    const Channels after = Limit(*limiter, input, 512);
    for (const auto& channel : after)
        for (float x : channel) ASSERT_TRUE(std::isfinite(x));
}

TEST(Limiter, ParametersKeepTheAlgorithmContract) {
    Limiter limiter;
    EXPECT_FALSE(limiter.SetParameter(3, 1.0f));
    EXPECT_EQ(limiter.GetParameter(3), 0.0f);
    limiter.SetParameter(Limiter::kCeiling, -12.0f);
    limiter.Prepare(44100.9f, 256);
    EXPECT_EQ(limiter.GetParameter(Limiter::kCeiling), 0.0f);
    EXPECT_EQ(limiter.GetSampleRate(), 44100);
    // The ceiling law and its floor; the soft knee's ends.
    EXPECT_NEAR(Limiter::CeilingGain(-24.0f), 0.0617, 0.0001);
    EXPECT_EQ(Limiter::CeilingGain(-1000.0f), 1.1754944e-38f);
    EXPECT_EQ(Limiter::Soften(0.2f, 0.25f), 0.2f);
    EXPECT_FLOAT_EQ(Limiter::Soften(-0.25f, 0.25f), -0.25f);
    EXPECT_FLOAT_EQ(Limiter::Soften(100.0f, 0.25f), 0.25f / 0.7615942f);
    // More channels than the meters hold are refused, buffers untouched.
    Limiter wide;
    wide.SetChannelCount(Limiter::kMaxChannels + 1);
    wide.Prepare(48000.0f, 64);
    Channels io(Limiter::kMaxChannels + 1, std::vector<float>(64, 0.5f));
    std::vector<float*> pointers;
    for (auto& channel : io) pointers.push_back(channel.data());
    EXPECT_FALSE(wide.Process(pointers.data(), 64));
    EXPECT_EQ(io[0][0], 0.5f);
}
