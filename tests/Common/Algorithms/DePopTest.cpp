// DePop: a plosive's low thump pulls the gain down, the voice does not.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/DePop.h"
#include "Support/Signals.h"
#include "Support/Speech.h"

namespace {

constexpr float kRate = 48000.0f;

// A "p": an 80 Hz thump decaying over some 15 ms, followed by a vowel.
struct Plosive {
    std::vector<float> samples;
    std::size_t vowelStart = 0;
};

Plosive MakePlosive(bool withPop) {
    const zentest::SpeechLike speech = zentest::MakeSpeechLike(kRate, 1);
    const zentest::Region vowel = speech.vowels[0];
    Plosive p;
    p.vowelStart = static_cast<std::size_t>(0.03 * kRate);
    p.samples.assign(p.vowelStart, 0.0f);
    p.samples.insert(p.samples.end(), speech.samples.begin() + static_cast<std::ptrdiff_t>(vowel.first),
                     speech.samples.begin() + static_cast<std::ptrdiff_t>(vowel.second));
    if (withPop)
        for (std::size_t n = 0; n < p.samples.size(); ++n) {
            const double t = static_cast<double>(n) / kRate;
            p.samples[n] += static_cast<float>(0.8 * std::exp(-t / 0.015) * std::sin(2.0 * zentest::kPi * 80.0 * t));
        }
    return p;
}

std::vector<float> Filtered(DePop& d, std::vector<float> x, std::size_t block) {
    for (std::size_t done = 0; done < x.size(); done += block) {
        float* channels[] = {x.data() + done};
        EXPECT_TRUE(d.Process(channels, std::min(block, x.size() - done)));
    }
    return x;
}

std::unique_ptr<DePop> Make(std::uint64_t channels = 1, std::uint32_t maxBlock = 512) {
    auto d = std::make_unique<DePop>();
    d->SetChannelCount(channels);
    d->Prepare(kRate, maxBlock);
    return d;
}

}  // namespace

TEST(DePop, TamesThePopAndLeavesTheVoice) {
    const Plosive popped = MakePlosive(true);
    auto d = Make();
    const std::vector<float> out = Filtered(*d, popped.samples, 512);
    // Without look-ahead the first half-cycle slips through; the burst as a whole drops.
    EXPECT_LT(zentest::ToDb(zentest::Rms(out, 0, popped.vowelStart) / zentest::Rms(popped.samples, 0, popped.vowelStart)),
              -6.0);
    // Once the thump is gone the vowel returns to its own level.
    const std::size_t settled = popped.vowelStart + static_cast<std::size_t>(0.12 * kRate);
    EXPECT_NEAR(zentest::ToDb(zentest::Rms(out, settled) / zentest::Rms(popped.samples, settled)), 0.0, 0.5);

    // The voice alone passes as it is: its fundamental stays under the detector.
    const Plosive clean = MakePlosive(false);
    auto voiceOnly = Make();
    const std::vector<float> voice = Filtered(*voiceOnly, clean.samples, 512);
    EXPECT_NEAR(zentest::ToDb(zentest::Rms(voice) / zentest::Rms(clean.samples)), 0.0, 0.1);
    EXPECT_GT(voiceOnly->GetMeter(DePop::kGainReductionMeter), -0.5f);
}

TEST(DePop, LongBlocksAndStereoAndRefusedLayouts) {
    const Plosive popped = MakePlosive(true);
    auto shortBlocks = Make(1, 64);
    auto longBlocks = Make(1, 64);  // blocks far beyond the prepared maximum
    EXPECT_EQ(Filtered(*longBlocks, popped.samples, 5000), Filtered(*shortBlocks, popped.samples, 64));

    // Stereo is linked: a pop on the left ducks the right as well.
    auto stereo = Make(2);
    std::vector<float> left = popped.samples, right(left.size(), 0.1f);
    float* channels[] = {left.data(), right.data()};
    ASSERT_TRUE(stereo->Process(channels, left.size()));
    EXPECT_LT(zentest::ToDb(*std::min_element(right.begin(), right.end()) / 0.1), -6.0);

    auto three = Make(3);
    const std::vector<float> before = left;
    float* wide[] = {left.data(), left.data(), left.data()};
    EXPECT_FALSE(three->Process(wide, left.size()));
    EXPECT_EQ(left, before);
}
