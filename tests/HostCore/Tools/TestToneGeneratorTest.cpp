// Test tones as measured by an engineer: a sine's level and THD+N, noise
// levels, a sweep's span, the channel it goes to, and the rendered file.
#include <gtest/gtest.h>
#include <sndfile.h>

#include <cmath>
#include <cstdio>
#include <tuple>
#include <vector>

#include "HostCore/Devices/NullDevice.h"
#include "HostCore/Tools/TestToneGenerator.h"
#include "Support/Signals.h"

using zen::host::OscillatorDocument;
using zen::host::TestToneGenerator;

namespace {

// Every channel of the tone, rendered through the null device's blocks.
std::vector<std::vector<float>> Render(const OscillatorDocument::Tone& tone, std::uint32_t block = 333) {
    TestToneGenerator generator(tone);
    struct Capture : zen::host::AudioCallback {
        TestToneGenerator* source;
        std::vector<std::vector<float>> channels;
        void ProcessBlock(const float* const* in, float* const* out, std::uint32_t n) noexcept override {
            source->ProcessBlock(in, out, n);
            for (std::size_t c = 0; c < channels.size(); ++c) channels[c].insert(channels[c].end(), out[c], out[c] + n);
        }
    } capture;
    capture.source = &generator;
    capture.channels.resize(static_cast<std::size_t>(tone.channels));
    zen::host::NullDevice device({tone.sampleRate, block, 0, static_cast<std::uint32_t>(tone.channels)});
    device.Run(capture, generator.Frames());
    return capture.channels;
}

// Least-squares fit of a sine of known frequency: amplitude, and the RMS of
// what is left (THD+N), both relative to the fitted sine.
void FitSine(const std::vector<float>& x, double frequency, double rate, double& amplitude, double& residualDb) {
    double ss = 0, cc = 0, sc = 0, sx = 0, cx = 0;
    for (std::size_t n = 0; n < x.size(); ++n) {
        const double w = 2.0 * zentest::kPi * frequency * static_cast<double>(n) / rate;
        const double s = std::sin(w), c = std::cos(w);
        ss += s * s, cc += c * c, sc += s * c, sx += s * x[n], cx += c * x[n];
    }
    const double det = ss * cc - sc * sc;
    const double a = (sx * cc - cx * sc) / det, b = (cx * ss - sx * sc) / det;
    amplitude = std::hypot(a, b);
    double residual = 0.0;
    for (std::size_t n = 0; n < x.size(); ++n) {
        const double w = 2.0 * zentest::kPi * frequency * static_cast<double>(n) / rate;
        const double e = x[n] - (a * std::sin(w) + b * std::cos(w));
        residual += e * e;
    }
    residualDb = 20.0 * std::log10(std::sqrt(residual / static_cast<double>(x.size())) / (amplitude / std::sqrt(2.0)));
}

}  // namespace

TEST(TestToneGenerator, SineLevelIsExactAndThdPlusNoiseStaysBelowMinus120dB) {
    for (const auto& [level, frequency, rate] :
         {std::tuple{-20.0, 1000.0, 48000}, {0.0, 997.0, 44100}, {-60.0, 19000.0, 96000}}) {
        OscillatorDocument::Tone tone;
        tone.levelDb = level;
        tone.frequency = frequency;
        tone.sampleRate = rate;
        tone.duration = 0.25;
        tone.channels = 1;
        const auto out = Render(tone);
        ASSERT_EQ(out[0].size(), static_cast<std::size_t>(0.25 * rate));
        double amplitude = 0.0, thdn = 0.0;
        FitSine(out[0], frequency, rate, amplitude, thdn);
        EXPECT_NEAR(20.0 * std::log10(amplitude), level, 0.01) << frequency << " Hz";
        EXPECT_LT(thdn, -120.0) << frequency << " Hz at " << level << " dBFS";
    }
}

TEST(TestToneGenerator, NoiseRmsIsThatOfASineOfTheLevelAndSweepsSpanTheirRange) {
    for (auto signal : {OscillatorDocument::kPink, OscillatorDocument::kWhite}) {
        OscillatorDocument::Tone tone;
        tone.signal = signal;
        tone.levelDb = -12.0;
        tone.duration = 0.5;
        tone.channels = 1;
        const auto out = Render(tone);
        EXPECT_NEAR(zentest::ToDb(zentest::Rms(out[0])), -12.0 - 3.0103, 0.01) << signal;
        EXPECT_EQ(out[0], Render(tone, 64)[0]);  // the block split changes nothing
    }
    OscillatorDocument::Tone sweep;
    sweep.signal = OscillatorDocument::kSweep;
    sweep.levelDb = -6.0;
    sweep.frequency = 100.0;
    sweep.sweepEnd = 10000.0;
    sweep.duration = 1.0;
    sweep.channels = 1;
    const auto out = Render(sweep);
    EXPECT_NEAR(zentest::ToDb(zentest::Peak(out[0])), -6.0, 0.01);
    // Zero crossings per 10 ms near the start and the end: 100 Hz and 10 kHz.
    auto crossings = [&](std::size_t from) {
        int n = 0;
        for (std::size_t i = from + 1; i < from + 480; ++i) n += (out[0][i - 1] < 0.0f) != (out[0][i] < 0.0f);
        return n / 2.0 / 0.01;
    };
    EXPECT_NEAR(crossings(0), 100.0, 60.0);
    EXPECT_NEAR(crossings(48000 - 480), 10000.0, 600.0);
}

TEST(TestToneGenerator, OneChannelOrAllAndTheFileHoldsTheToneExactly) {
    OscillatorDocument::Tone tone;
    tone.channels = 3;
    tone.channel = 2;
    tone.duration = 0.05;
    const auto out = Render(tone);
    EXPECT_EQ(zentest::Peak(out[0]), 0.0f);
    EXPECT_GT(zentest::Peak(out[1]), 0.09f);
    EXPECT_EQ(zentest::Peak(out[2]), 0.0f);

    const std::string path = std::string(::testing::TempDir()) + "tone.wav";
    tone.channel = 0;
    TestToneGenerator::Render(tone, path);
    SF_INFO info{};
    SNDFILE* file = sf_open(path.c_str(), SFM_READ, &info);
    ASSERT_NE(file, nullptr);
    EXPECT_EQ(info.channels, 3);
    EXPECT_EQ(info.samplerate, 48000);
    std::vector<float> interleaved(static_cast<std::size_t>(info.frames * info.channels));
    sf_readf_float(file, interleaved.data(), info.frames);
    sf_close(file);
    std::remove(path.c_str());
    ASSERT_EQ(static_cast<std::size_t>(info.frames), out[1].size());
    for (std::size_t i = 0; i < out[1].size(); ++i) ASSERT_EQ(interleaved[i * 3 + 2], out[1][i]) << i;
}
