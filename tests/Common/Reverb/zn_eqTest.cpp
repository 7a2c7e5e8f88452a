// The reverb's tone control: both bands at once are exactly a low-shelf
// BiQuad followed by a high-shelf BiQuad, and a non-finite input does not
// ring in them for ever.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/BiQuad.h"
#include "Common/Reverb/zn_eq.h"
#include "Support/Signals.h"

using zen::reverb::zn_eq;
using zen::reverb::zn_eq_param;

namespace {

constexpr std::uint32_t kChannels = 5;  // pairs of lanes and one alone

using Channels = std::vector<std::vector<float>>;

void Shelf(BiQuad& b, BiQuad::Shape shape, const zn_eq_param::Band& band) {
    b.SetChannelCount(kChannels);
    b.Prepare(48000.0f, 512);
    b.SetParameter(BiQuad::kIn, 1.0f);
    b.SetParameter(BiQuad::kShape, static_cast<float>(shape));
    b.SetParameter(BiQuad::kGain, 20.0f * std::log10(band.gain));
    b.SetParameter(BiQuad::kFreq, band.frequency);
    b.SetParameter(BiQuad::kQ, band.shape);
}

std::vector<float*> Pointers(Channels& io) {
    std::vector<float*> p;
    for (auto& c : io) p.push_back(c.data());
    return p;
}

}  // namespace

TEST(zn_eq, IsALowShelfThenAHighShelfBitForBit) {
    zn_eq_param param;
    param.low = {150.0f, 2.5f, 0.7f};
    param.high = {6000.0f, 0.3f, 0.5f};
    zn_eq eq;
    eq.SetChannelCount(kChannels);
    eq.Prepare(48000.0f, 512);
    eq.Configure(param);
    BiQuad low, high;
    Shelf(low, BiQuad::kLowShelf, param.low);
    Shelf(high, BiQuad::kHighShelf, param.high);

    Channels io, expected;
    for (std::uint32_t c = 0; c < kChannels; ++c) io.push_back(zentest::Noise(3000, 0.8, c + 1));
    expected = io;
    auto p = Pointers(io), e = Pointers(expected);
    for (std::size_t done = 0; done < 3000; done += 500) {
        for (std::uint32_t c = 0; c < kChannels; ++c) {
            p[c] = io[c].data() + done;
            e[c] = expected[c].data() + done;
        }
        eq.Process(p.data(), 500);
        low.Process(e.data(), 500);
        high.Process(e.data(), 500);
    }
    EXPECT_EQ(io, expected);
}

TEST(zn_eq, ANonFiniteInputDoesNotRingForEver) {
    zn_eq eq;
    eq.SetChannelCount(2);
    eq.Prepare(48000.0f, 64);
    eq.Configure(zn_eq_param{{300.0f, 4.0f, 0.5f}, {9000.0f, 0.5f, 0.5f}});
    Channels io = {zentest::Noise(64, 0.5, 1), zentest::Noise(64, 0.5, 2)};
    io[1][10] = NAN;
    auto p = Pointers(io);
    eq.Process(p.data(), 64);
    io = {zentest::Noise(64, 0.5, 3), zentest::Noise(64, 0.5, 4)};
    p = Pointers(io);
    eq.Process(p.data(), 64);
    for (const auto& channel : io)
        for (float v : channel) ASSERT_TRUE(std::isfinite(v));
}
