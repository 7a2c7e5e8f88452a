// "Pitch" run from zenfx: the host compensates the reported latency, so an
// unshifted run lines up with the input, and a shifted one keeps its length.
#include <gtest/gtest.h>

#include <cmath>

#include "ZenfxRunner.h"

using zentest::ReadAudio;
using zentest::RunZenfx;
using zentest::TempFolder;
using zentest::WriteAudio;

namespace {

std::vector<float> Material(std::size_t frames, double f0) {
    std::vector<float> x(frames);
    for (std::size_t n = 0; n < frames; ++n) {
        const double t = static_cast<double>(n) / 48000.0;
        x[n] = static_cast<float>((0.3 * std::sin(2 * M_PI * f0 * t) + 0.1 * std::sin(2 * M_PI * 3.1 * f0 * t)) *
                                  (0.6 + 0.4 * std::sin(2 * M_PI * 3.0 * t)));
    }
    return x;
}

}  // namespace

TEST(ZenfxPitch, UnshiftedOutputLinesUpWithTheInput) {
    TempFolder folder;
    const std::vector<std::vector<float>> input = {Material(30000, 220.0), Material(30000, 330.0)};
    WriteAudio(folder / "in.wav", input, 48000);
    const auto result = RunZenfx({"process", folder / "in.wav", "-o", folder / "out.wav", "--plugin", "Pitch"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    const auto out = ReadAudio(folder / "out.wav");
    ASSERT_EQ(out.info.frames, 30000);
    ASSERT_EQ(out.info.channels, 2);
    for (int c = 0; c < 2; ++c) {
        const auto y = out.Channel(c);
        double err = 0.0, ref = 0.0;
        for (std::size_t i = 0; i < y.size(); ++i) {
            err += std::pow(y[i] - input[c][i], 2.0);
            ref += input[c][i] * input[c][i];
        }
        EXPECT_LT(10.0 * std::log10(err / ref), -60.0) << "channel " << c;
    }
}

TEST(ZenfxPitch, ShiftedOutputKeepsTheLengthAndTakesSettingsByLabel) {
    TempFolder folder;
    WriteAudio(folder / "in.wav", {Material(20000, 220.0)}, 44100);
    const auto result = RunZenfx({"process", folder / "in.wav", "-o", folder / "out.flac", "--plugin", "pitch",
                                  "--set", "Semitones=-7", "--set", "Cents=25", "--set", "Algorithm=PLPV",
                                  "--set", "Dry/Wet=80%"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    const auto out = ReadAudio(folder / "out.flac");
    EXPECT_EQ(out.info.frames, 20000);
    EXPECT_EQ(out.info.samplerate, 44100);
}
