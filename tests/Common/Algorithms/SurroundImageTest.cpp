// SurroundImage and SpeakerLayout: the energy vector of known mixes on the
// standard 5.1 and 7.1 layouts, and the loudness weights of each layout.
#include <gtest/gtest.h>

#include <cmath>
#include <vector>

#include "Common/Algorithms/SpeakerLayout.h"
#include "Common/Algorithms/SurroundImage.h"
#include "Support/Signals.h"

using zen::SpeakerLayout;
using zen::SurroundImage;

namespace {

SurroundImage::Image ImageOf(std::size_t channels, std::vector<double> powers) {
    SurroundImage image;
    image.Configure(channels, SpeakerLayout::DefaultLfe(channels));
    return image.Compute(powers.data());
}

}  // namespace

TEST(SurroundImage, PointsAtTheSpeakersAndSpreadsWithThem) {
    struct Case {
        const char* what;
        std::size_t channels;
        std::vector<double> powers;
        double direction, spread;
    } cases[] = {
        {"centre alone", 6, {0, 0, 1, 0, 0, 0}, 0.0, 0.0},
        {"left alone", 6, {1, 0, 0, 0, 0, 0}, -30.0, 0.0},
        {"right surround alone", 6, {0, 0, 0, 0, 0, 1}, 110.0, 0.0},
        {"equal left and right", 6, {1, 1, 0, 0, 0, 0}, 0.0, 60.0},
        {"left and left surround", 6, {1, 0, 0, 0, 1, 0}, -70.0, 80.0},
        {"a loud LFE changes nothing", 6, {0, 0, 1, 100, 0, 0}, 0.0, 0.0},
        {"7.1 left side", 8, {0, 0, 0, 0, 0, 0, 1, 0}, -90.0, 0.0},
        {"7.1 right back", 8, {0, 0, 0, 0, 0, 1, 0, 0}, 135.0, 0.0},
        {"stereo, right louder", 2, {1, 3, 0}, 16.1, 0.0},
    };
    for (const Case& c : cases) {
        const SurroundImage::Image image = ImageOf(c.channels, c.powers);
        ASSERT_TRUE(image.valid) << c.what;
        EXPECT_NEAR(image.direction, c.direction, 0.1) << c.what;
        if (c.channels != 2) {
            EXPECT_NEAR(image.spread, c.spread, 0.1) << c.what;
        }
    }
    // All five main channels alike: three speakers in front pull it forward.
    const SurroundImage::Image all = ImageOf(6, {1, 1, 1, 0, 1, 1});
    const double length = (2.0 * std::cos(30.0 * zentest::kPi / 180.0) + 1.0 + 2.0 * std::cos(110.0 * zentest::kPi / 180.0)) / 5.0;
    EXPECT_NEAR(all.direction, 0.0, 1e-9);
    EXPECT_NEAR(all.length, length, 1e-9);
    EXPECT_NEAR(all.spread, 2.0 * std::acos(length) * 180.0 / zentest::kPi, 1e-9);
    // Silence and layouts without azimuths have no image.
    EXPECT_FALSE(ImageOf(6, {0, 0, 0, 0, 0, 0}).valid);
    EXPECT_FALSE(ImageOf(10, std::vector<double>(10, 1.0)).valid);
}

TEST(SpeakerLayout, WeighsSurroundsAndFindsTheLfe) {
    EXPECT_EQ(SpeakerLayout::DefaultLfe(2), SpeakerLayout::kNoLfe);
    EXPECT_EQ(SpeakerLayout::DefaultLfe(6), 3);
    EXPECT_EQ(SpeakerLayout::DefaultLfe(8), 3);
    EXPECT_EQ(SpeakerLayout::DefaultLfe(16), SpeakerLayout::kNoLfe);
    const std::vector<double> fiveOne = {1, 1, 1, 0, 1.41, 1.41};
    const std::vector<double> sevenOne = {1, 1, 1, 0, 1.41, 1.41, 1.41, 1.41};
    for (std::size_t c = 0; c < 6; ++c) EXPECT_EQ(SpeakerLayout::LoudnessWeight(6, c, 3), fiveOne[c]) << c;
    for (std::size_t c = 0; c < 8; ++c) EXPECT_EQ(SpeakerLayout::LoudnessWeight(8, c, 3), sevenOne[c]) << c;
    // Another LFE channel, or none: the old one counts as its layout says.
    EXPECT_EQ(SpeakerLayout::LoudnessWeight(6, 3, SpeakerLayout::kNoLfe), 1.0);
    EXPECT_EQ(SpeakerLayout::LoudnessWeight(6, 5, 5), 0.0);
    EXPECT_EQ(SpeakerLayout::LoudnessWeight(5, 4, SpeakerLayout::kNoLfe), 1.41);
    EXPECT_EQ(SpeakerLayout::LoudnessWeight(12, 9, SpeakerLayout::kNoLfe), 1.0);
}
