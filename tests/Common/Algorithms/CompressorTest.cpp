// Compressor: the hard-knee law with makeup and limit, envelope times from
// level steps, linked and sidechain detection, and the layouts it refuses.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/Compressor.h"
#include "Support/Signals.h"

namespace {

constexpr float kRate = 48000.0f;

struct Settings {
    float threshold = -20.0f, ratio = 4.0f, attack = 0.1f, hold = 0.0f, release = 4000.0f, makeup = 0.0f,
          limit = 50.0f;
};

std::unique_ptr<Compressor> Make(const Settings& s, std::uint64_t channels = 1) {
    auto c = std::make_unique<Compressor>();
    c->SetChannelCount(channels);
    c->Prepare(kRate, 512);
    c->SetParameter(Compressor::kThreshold, s.threshold);
    c->SetParameter(Compressor::kRatio, s.ratio);
    c->SetParameter(Compressor::kAttack, s.attack);
    c->SetParameter(Compressor::kHold, s.hold);
    c->SetParameter(Compressor::kRelease, s.release);
    c->SetParameter(Compressor::kMakeup, s.makeup);
    c->SetParameter(Compressor::kGrLimit, s.limit);
    c->Reset();
    return c;
}

// Output peak in dBFS for a steady 1 kHz sine at `levelDb` peak.
double SteadyOutputDb(const Settings& s, double levelDb) {
    auto c = Make(s);
    std::vector<float> x = zentest::Sine(1000.0, kRate, 24000, std::pow(10.0, levelDb / 20.0));
    float* channels[] = {x.data()};
    c->Process(channels, x.size());
    return zentest::ToDb(zentest::Peak(x, 19200));
}

// A square wave: the same magnitude every sample, so the detector sees a
// steady level with no ripple. Levels change at the given sample indices.
std::vector<float> Steps(std::size_t frames, std::vector<std::pair<std::size_t, double>> levelsDb) {
    std::vector<float> x(frames);
    double level = 0;
    for (std::size_t n = 0; n < frames; ++n) {
        for (const auto& [at, db] : levelsDb)
            if (n == at) level = std::pow(10.0, db / 20.0);
        x[n] = static_cast<float>(n % 2 ? level : -level);
    }
    return x;
}

// First index at or after `from` where the applied gain (dB) has covered 63.2 %
// of the way from `startDb` to `endDb`.
std::size_t TimeConstantIndex(const std::vector<float>& in, const std::vector<float>& out, std::size_t from,
                              double startDb, double endDb) {
    const double target = startDb + (1.0 - std::exp(-1.0)) * (endDb - startDb);
    for (std::size_t n = from; n < in.size(); ++n) {
        const double gainDb = zentest::ToDb(std::fabs(out[n] / in[n]));
        if (endDb < startDb ? gainDb <= target : gainDb >= target) return n;
    }
    return in.size();
}

}  // namespace

TEST(Compressor, StaticCurveFollowsTheHardKneeWithMakeupAndLimit) {
    Settings s;
    s.makeup = 3.0f;
    for (double level : {-45.0, -30.0, -20.0, -12.0, -4.0, 0.0}) {
        const double expected = (level <= -20.0 ? level : -20.0 + (level + 20.0) / 4.0) + 3.0;
        EXPECT_NEAR(SteadyOutputDb(s, level), expected, 0.05) << level << " dB in";
    }
    s.makeup = 0.0f;
    s.limit = 6.0f;  // 20 dB above a 4:1 threshold wants 15 dB: held at 6
    EXPECT_NEAR(SteadyOutputDb(s, 0.0), -6.0, 0.05);
    EXPECT_NEAR(SteadyOutputDb(s, -16.0), -19.0, 0.05);  // within the limit: the law
    s.limit = 0.0f;
    EXPECT_NEAR(SteadyOutputDb(s, 0.0), 0.0, 0.01);
    s.limit = 50.0f;
    s.ratio = 20.0f;  // slope 0.95
    EXPECT_NEAR(SteadyOutputDb(s, 0.0), -20.0 + 20.0 / 20.0, 0.05);
}

TEST(Compressor, AttackHoldAndReleaseTimesFromLevelSteps) {
    for (float rate : {48000.0f, 96000.0f})
        for (const auto& [attack, hold, release] : {std::tuple{1.4f, 0.0f, 150.0f}, {10.0f, 30.0f, 60.0f}}) {
            Settings s;
            s.attack = attack;
            s.hold = hold;  // 30 ms spans several 256-sample blocks
            s.release = release;
            auto c = std::make_unique<Compressor>();
            c->SetChannelCount(1);
            c->Prepare(rate, 256);
            for (auto [index, value] : {std::pair{Compressor::kThreshold, s.threshold}, {Compressor::kRatio, s.ratio},
                                       {Compressor::kAttack, attack}, {Compressor::kHold, hold},
                                       {Compressor::kRelease, release}})
                c->SetParameter(index, value);
            c->Reset();
            const auto up = static_cast<std::size_t>(0.05 * rate), down = static_cast<std::size_t>(0.5 * rate);
            const std::vector<float> in = Steps(static_cast<std::size_t>(1.2 * rate), {{0, -40.0}, {up, 0.0}, {down, -40.0}});
            std::vector<float> out = in;
            for (std::size_t done = 0; done < out.size(); done += 256) {
                float* channels[] = {out.data() + done};
                c->Process(channels, std::min<std::size_t>(256, out.size() - done));
            }
            const double reduced = -20.0 * 0.75;  // 20 dB over a 4:1 threshold
            const double samplesPerMs = rate / 1000.0;
            EXPECT_NEAR(TimeConstantIndex(in, out, up, 0.0, reduced) + 1 - up, attack * samplesPerMs, 1.0) << rate;
            EXPECT_NEAR(TimeConstantIndex(in, out, down, reduced, 0.0) + 1 - down, (hold + release) * samplesPerMs, 2.0)
                << rate << " hold " << hold;
            const std::size_t lastHeld = down + static_cast<std::size_t>(hold * samplesPerMs) - 1;
            EXPECT_NEAR(zentest::ToDb(out[lastHeld] / in[lastHeld]), reduced, 0.01) << "held";
        }
}

TEST(Compressor, StereoDetectionIsLinkedAndTheSidechainDrivesTheGain) {
    auto c = Make(Settings{}, 2);
    std::vector<float> loud = zentest::Sine(1000.0, kRate, 9600, 1.0), quiet = zentest::Sine(300.0, kRate, 9600, 0.01);
    const std::vector<float> loudIn = loud, quietIn = quiet;
    float* stereo[] = {loud.data(), quiet.data()};
    ASSERT_TRUE(c->Process(stereo, 9600));
    // The quiet channel follows the loud one's gain: 20 dB over 4:1 is -15 dB.
    EXPECT_NEAR(zentest::ToDb(zentest::Peak(quiet, 4800) / zentest::Peak(quietIn, 4800)), -15.0, 0.05);
    EXPECT_NEAR(zentest::ToDb(zentest::Peak(loud, 4800)), -15.0, 0.05);
    EXPECT_NEAR(c->GetMeter(Compressor::kGainReductionMeter), -15.0f, 0.05f);

    auto side = Make(Settings{});
    side->SetParameter(Compressor::kSidechainOn, 1.0f);
    std::vector<float> main = quietIn, key = loudIn;
    float* withKey[] = {main.data(), key.data()};
    ASSERT_TRUE(side->Process(withKey, 9600));
    EXPECT_NEAR(zentest::ToDb(zentest::Peak(main, 4800) / zentest::Peak(quietIn, 4800)), -15.0, 0.05);
    EXPECT_EQ(key, loudIn);  // the sidechain is only listened to
}

TEST(Compressor, BelowThresholdOnlyMakeupAndRefusedLayoutsAreUntouched) {
    Settings s;
    s.makeup = 6.0f;
    auto c = Make(s, 2);
    std::vector<float> a(64, 0.05f), b(64, -0.05f), key(64, 0.01f);
    float* channels[] = {a.data(), b.data(), key.data(), key.data(), key.data()};
    ASSERT_TRUE(c->Process(channels, 64));
    EXPECT_FLOAT_EQ(a[63], 0.05f * std::pow(10.0f, 6.0f / 20.0f));
    EXPECT_NEAR(c->GetMeter(Compressor::kGainMeter), 6.0f, 1e-4f);

    c->SetParameter(Compressor::kSidechainOn, 1.0f);
    const std::vector<float> before = a;
    for (std::uint64_t sidechains : {0u, 3u}) {
        c->SetSidechainChannelCount(sidechains);
        EXPECT_FALSE(c->Process(channels, 64)) << sidechains;  // two mains take one or two sidechains
        EXPECT_EQ(a, before);
    }
    c->SetSidechainChannelCount(2);
    EXPECT_TRUE(c->Process(channels, 64));
    c->SetChannelCount(1);
    c->SetSidechainChannelCount(3);
    EXPECT_TRUE(c->Process(channels, 64));
}
