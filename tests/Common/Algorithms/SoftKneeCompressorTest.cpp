// SoftKneeCompressor: with no knee it is the Compressor's law sample for
// sample (within a thousandth of a dB); the knee's quadratic curve, its edges and the limit; times; and a
// law handed per sample.
#include <gtest/gtest.h>

#include <cmath>
#include <memory>

#include "Common/Algorithms/Compressor.h"
#include "Common/Algorithms/SoftKneeCompressor.h"
#include "Support/Dynamics.h"
#include "Support/Signals.h"

namespace {

using Settings = std::vector<std::pair<SoftKneeCompressor::Parameter, float>>;

std::unique_ptr<SoftKneeCompressor> Make(const Settings& settings, std::uint64_t channels = 1, float rate = 48000.0f) {
    auto c = std::make_unique<SoftKneeCompressor>();
    c->SetChannelCount(channels);
    c->Prepare(rate, 256);
    for (const auto& [index, value] : settings) c->SetParameter(index, value);
    c->Reset();
    return c;
}

// The steady gain (dB) applied to a level step held at `levelDb`.
double SteadyGainDb(const Settings& settings, double levelDb) {
    const std::vector<float> in = zentest::LevelSteps(24000, {{0, levelDb}});
    std::vector<float> out = in;
    float* channels[] = {out.data()};
    Make(settings)->Process(channels, out.size());
    return zentest::GainDb(out, in, out.size() - 1);
}

}  // namespace

TEST(SoftKneeCompressor, WithoutAKneeItIsTheCompressorsLawSampleForSample) {
    const std::vector<float> music = [] {
        std::vector<float> x = zentest::Sine(180.0, 48000.0, 96 * 512, 0.6);
        const std::vector<float> noise = zentest::Noise(x.size(), 0.3, 5);
        for (std::size_t n = 0; n < x.size(); ++n) x[n] = x[n] * (n / 12000 % 2 ? 1.0f : 0.05f) + noise[n] * 0.2f;
        return x;
    }();
    Compressor reference;
    reference.SetChannelCount(2);
    reference.Prepare(48000.0f, 512);
    for (const auto& [index, value] : std::vector<std::pair<Compressor::Parameter, float>>{
             {Compressor::kThreshold, -18.0f}, {Compressor::kRatio, 3.0f}, {Compressor::kAttack, 5.0f},
             {Compressor::kRelease, 120.0f}, {Compressor::kMakeup, 4.0f}})
        reference.SetParameter(index, value);
    reference.Reset();
    auto knee = Make({{SoftKneeCompressor::kThreshold, -18.0f}, {SoftKneeCompressor::kRatio, 3.0f},
                      {SoftKneeCompressor::kKnee, 0.0f}, {SoftKneeCompressor::kAttack, 5.0f},
                      {SoftKneeCompressor::kRelease, 120.0f}, {SoftKneeCompressor::kMakeup, 4.0f}},
                     2);
    std::vector<float> a = music, b(music.size(), 0.01f), c = a, d = b;
    float* want[] = {a.data(), b.data()};
    float* got[] = {c.data(), d.data()};
    for (std::size_t done = 0; done < music.size(); done += 512) {
        float* w[] = {want[0] + done, want[1] + done};
        float* g[] = {got[0] + done, got[1] + done};
        reference.Process(w, 512);
        knee->Process(g, 512);
        ASSERT_NEAR(knee->GetMeter(SoftKneeCompressor::kGainReductionMeter),
                    reference.GetMeter(Compressor::kGainReductionMeter), 1e-3)
            << done;
    }
    // Both channels, the quiet one taking the loud one's gain (linked).
    double worst = 0.0;
    for (std::size_t n = 0; n < music.size(); ++n) {
        if (music[n] != 0.0f) worst = std::max(worst, std::fabs(zentest::GainDb(c, a, n)));
        worst = std::max(worst, std::fabs(zentest::GainDb(d, b, n)));
    }
    EXPECT_LT(worst, 1e-3);
}

TEST(SoftKneeCompressor, TheKneeIsQuadraticBetweenItsEdgesAndTheLimitHolds) {
    const Settings law = {{SoftKneeCompressor::kThreshold, -20.0f}, {SoftKneeCompressor::kRatio, 4.0f},
                          {SoftKneeCompressor::kKnee, 12.0f}, {SoftKneeCompressor::kAttack, 0.1f},
                          {SoftKneeCompressor::kMakeup, 2.0f}};
    // slope 0.75; edges at -26 and -14 dB; within, -0.75 (L + 26)^2 / 24 dB.
    for (double level : {-40.0, -26.0, -23.0, -20.0, -16.0, -14.0, -6.0, 0.0}) {
        const double over = level + 26.0;
        const double reduction = level <= -26.0 ? 0.0 : level >= -14.0 ? -0.75 * (level + 20.0) : -0.75 * over * over / 24.0;
        EXPECT_NEAR(SteadyGainDb(law, level), reduction + 2.0, 0.02) << level << " dB in";
    }
    // 60 dB over a 20:1 threshold wants 57 dB: the limit stops at 50.
    EXPECT_NEAR(SteadyGainDb({{SoftKneeCompressor::kThreshold, -60.0f}, {SoftKneeCompressor::kRatio, 20.0f},
                              {SoftKneeCompressor::kKnee, 0.0f}, {SoftKneeCompressor::kAttack, 0.1f}},
                             0.0),
                -50.0, 0.02);
    EXPECT_NEAR(SteadyGainDb({{SoftKneeCompressor::kRatio, 1.0f}}, 0.0), 0.0, 1e-6);  // ratio 1: never
}

TEST(SoftKneeCompressor, AttackAndReleaseTimesFromLevelSteps) {
    for (float rate : {44100.0f, 96000.0f}) {
        auto c = Make({{SoftKneeCompressor::kThreshold, -20.0f}, {SoftKneeCompressor::kRatio, 4.0f},
                       {SoftKneeCompressor::kKnee, 0.0f}, {SoftKneeCompressor::kAttack, 8.0f},
                       {SoftKneeCompressor::kRelease, 80.0f}},
                      1, rate);
        const auto up = static_cast<std::size_t>(0.05 * rate), down = static_cast<std::size_t>(0.5 * rate);
        const std::vector<float> in =
            zentest::LevelSteps(static_cast<std::size_t>(1.2 * rate), {{0, -40.0}, {up, 0.0}, {down, -40.0}});
        std::vector<float> out = in;
        for (std::size_t done = 0; done < out.size(); done += 256) {
            float* channels[] = {out.data() + done};
            c->Process(channels, std::min<std::size_t>(256, out.size() - done));
        }
        const double perMs = rate / 1000.0;
        EXPECT_NEAR(zentest::TimeConstantFrames(out, in, up, 0.0, -15.0), 8.0 * perMs, 1.0) << rate;
        EXPECT_NEAR(zentest::TimeConstantFrames(out, in, down, -15.0, 0.0), 80.0 * perMs, 2.0) << rate;
    }
}

TEST(SoftKneeCompressor, ALawPerSampleGlidesWhereTheParametersWouldStep) {
    auto fixed = Make({{SoftKneeCompressor::kKnee, 6.0f}});
    auto ramped = Make({{SoftKneeCompressor::kKnee, 6.0f}});
    const std::vector<float> in = zentest::Sine(400.0, 48000.0, 4096, 0.5);
    const float* detectors[] = {in.data()};
    std::vector<float> a(in.size()), b(in.size());
    std::vector<SoftKneeCompressor::Law> laws(in.size(), fixed->GetLaw());
    fixed->ComputeGains(detectors, 1, a.data(), in.size());
    ramped->ComputeGains(detectors, 1, b.data(), in.size(), laws.data());
    EXPECT_EQ(a, b);  // the same law either way

    // A threshold moving 12 dB over the block: the gain moves without a step.
    for (std::size_t n = 0; n < laws.size(); ++n)
        laws[n].threshold = static_cast<float>(-1.0 + 0.6 * static_cast<double>(n) / laws.size());
    auto gliding = Make({{SoftKneeCompressor::kKnee, 6.0f}});
    gliding->ComputeGains(detectors, 1, b.data(), in.size(), laws.data());
    EXPECT_LT(zentest::LargestStep(b), 0.01f);
    EXPECT_GT(b.back(), b[1000]);  // less reduction as the threshold rises
}
