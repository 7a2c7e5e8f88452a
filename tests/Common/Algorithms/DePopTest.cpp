// DePop: a plosive's low thump pulls the gain down, the voice does not.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/DePop.h"
#include "Support/Signals.h"
#include "Support/Speech.h"

namespace {

constexpr float kRate = 48000.0f;
const auto kVowelStart = static_cast<std::size_t>(0.03 * kRate);

// A vowel 30 ms after silence, with or without a "p": an 80 Hz thump decaying over 15 ms.
std::vector<float> Syllable(bool pop) {
    const zentest::SpeechLike speech = zentest::MakeSpeechLike(kRate, 1);
    std::vector<float> x(kVowelStart, 0.0f);
    x.insert(x.end(), speech.samples.begin() + static_cast<std::ptrdiff_t>(speech.vowels[0].first),
             speech.samples.begin() + static_cast<std::ptrdiff_t>(speech.vowels[0].second));
    for (std::size_t n = 0; pop && n < x.size(); ++n) {
        const double t = static_cast<double>(n) / kRate;
        x[n] += static_cast<float>(0.8 * std::exp(-t / 0.015) * std::sin(2.0 * zentest::kPi * 80.0 * t));
    }
    return x;
}

std::vector<float> Processed(std::vector<float> x, std::size_t block = 512, std::uint32_t maxBlock = 512) {
    DePop d;
    d.SetChannelCount(1);
    d.Prepare(kRate, maxBlock);
    for (std::size_t done = 0; done < x.size(); done += block) {
        float* channels[] = {x.data() + done};
        EXPECT_TRUE(d.Process(channels, std::min(block, x.size() - done)));
    }
    return x;
}

}  // namespace

TEST(DePop, TamesThePopAndLeavesTheVoice) {
    const std::vector<float> popped = Syllable(true), out = Processed(popped);
    // Without look-ahead the first half-cycle slips through; the burst as a whole drops.
    EXPECT_LT(zentest::ToDb(zentest::Rms(out, 0, kVowelStart) / zentest::Rms(popped, 0, kVowelStart)), -6.0);
    const std::size_t settled = kVowelStart + static_cast<std::size_t>(0.12 * kRate);
    EXPECT_NEAR(zentest::ToDb(zentest::Rms(out, settled) / zentest::Rms(popped, settled)), 0.0, 0.5);
    // The voice alone passes: its fundamental stays under the detector.
    const std::vector<float> voice = Syllable(false);
    EXPECT_NEAR(zentest::ToDb(zentest::Rms(Processed(voice)) / zentest::Rms(voice)), 0.0, 0.1);
    // Blocks beyond the prepared maximum change nothing.
    EXPECT_EQ(Processed(popped, 5000, 64), Processed(popped, 64, 64));
}

TEST(DePop, StereoIsLinkedAndThreeChannelsAreRefused) {
    DePop d;
    d.SetChannelCount(2);
    d.Prepare(kRate, 512);
    std::vector<float> left = Syllable(true), right(left.size(), 0.1f);
    float* channels[] = {left.data(), right.data(), right.data()};
    ASSERT_TRUE(d.Process(channels, left.size()));
    EXPECT_LT(zentest::ToDb(*std::min_element(right.begin(), right.end()) / 0.1), -6.0);  // ducked with the left
    d.SetChannelCount(3);
    const std::vector<float> before = left;
    EXPECT_FALSE(d.Process(channels, left.size()));
    EXPECT_EQ(left, before);
}
