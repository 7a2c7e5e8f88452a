// The built-in sounds: levels, lengths, takes that differ, and the spectral
// and temporal shape that makes each one what its name says.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/BiQuad.h"
#include "Plugins/ZenFoleySampler/FoleySynthesizer.h"

namespace {

std::vector<float> Samples(const FoleySound& sound) {
    const float* data = sound.Data(0) + FoleySound::kLeadPad;
    return std::vector<float>(data, data + sound.Frames());
}

double Energy(const std::vector<float>& x, std::size_t from = 0, std::size_t to = SIZE_MAX) {
    double sum = 0.0;
    for (std::size_t i = from; i < std::min(to, x.size()); ++i) sum += double(x[i]) * x[i];
    return sum;
}

// Share of the energy below `frequency`.
double LowShare(std::vector<float> x, double frequency) {
    const double total = Energy(x);
    BiQuad lowPass;
    lowPass.SetChannelCount(1);
    lowPass.Prepare(48000.0f, static_cast<std::uint32_t>(x.size()));
    lowPass.SetParameter(BiQuad::kIn, 1.0f);
    lowPass.SetParameter(BiQuad::kShape, BiQuad::kLowPass);
    lowPass.SetParameter(BiQuad::kFreq, static_cast<float>(frequency));
    lowPass.ProcessChannel(0, x.data(), x.size());
    return Energy(x) / total;
}

const std::vector<FoleyBank::Pad>& Pads() {
    static const std::vector<FoleyBank::Pad> pads = FoleySynthesizer::MakePads();
    return pads;
}

const FoleyBank::Pad& Pad(const std::string& name) {
    for (const auto& pad : Pads())
        if (pad.name == name) return pad;
    throw std::runtime_error("no pad " + name);
}

}  // namespace

TEST(FoleySynthesizer, EveryTakeIsFiniteAtItsPeakAndTakesDiffer) {
    ASSERT_EQ(Pads().size(), 11u);
    for (const auto& pad : Pads()) {
        ASSERT_EQ(pad.takes.size(), static_cast<std::size_t>(FoleySynthesizer::kTakesPerPad)) << pad.name;
        for (const FoleySound& take : pad.takes) {
            const std::vector<float> x = Samples(take);
            float peak = 0.0f;
            for (float s : x) {
                ASSERT_TRUE(std::isfinite(s)) << take.Name();
                peak = std::max(peak, std::fabs(s));
            }
            // Footsteps vary their level by up to 1.5 dB, the creak sits 1 dB down.
            EXPECT_LE(peak, FoleySynthesizer::kTakePeak * 1.0001f) << take.Name();
            EXPECT_GE(peak, FoleySynthesizer::kTakePeak * 0.84f) << take.Name();
            EXPECT_GT(take.Seconds(), 0.05) << take.Name();
            EXPECT_LT(take.Seconds(), 3.0) << take.Name();
            // Ends faded, so a take never stops with a click.
            EXPECT_LT(std::fabs(x.back()), 1e-3f) << take.Name();
        }
        EXPECT_NE(Samples(pad.takes[0]), Samples(pad.takes[1])) << pad.name;
    }
}

TEST(FoleySynthesizer, EachSoundHasTheShapeOfItsName) {
    const auto seconds = [](double s) { return static_cast<std::size_t>(s * 48000.0); };
    for (const FoleySound& take : Pad("Impact Thud").takes) EXPECT_GT(LowShare(Samples(take), 300.0), 0.7) << take.Name();
    for (const FoleySound& take : Pad("Cloth Rustle").takes) EXPECT_LT(LowShare(Samples(take), 800.0), 0.1) << take.Name();
    for (const FoleySound& take : Pad("Impact Metal").takes) {
        const std::vector<float> x = Samples(take);  // rings on
        EXPECT_GT(Energy(x, seconds(0.5)) / Energy(x), 0.1) << take.Name();
    }
    for (const FoleySound& take : Pad("Impact Wood").takes) {
        const std::vector<float> x = Samples(take);  // dies quickly
        EXPECT_LT(Energy(x, seconds(0.1)) / Energy(x), 0.05) << take.Name();
    }
    for (const char* name : {"Footstep Concrete", "Footstep Wood", "Footstep Gravel", "Footstep Grass"}) {
        for (const FoleySound& take : Pad(name).takes) {
            // Heel, then the ball of the foot 70 to 120 ms later: energy returns after a dip.
            const std::vector<float> x = Samples(take);
            const double heel = Energy(x, 0, seconds(0.03));
            const double toe = Energy(x, seconds(0.072), seconds(0.15));
            EXPECT_GT(toe, 0.1 * heel) << take.Name();
        }
    }
    for (const FoleySound& take : Pad("Door Creak").takes) EXPECT_GT(take.Seconds(), 0.7) << take.Name();
}
