// SpectrumAnalyzer: levels of tones and bands on the dBFS scale for every
// window, the summed view, averaging and peak decay in time, and frames
// that do not depend on the block split.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <memory>

#include "Common/Algorithms/OctaveBands.h"
#include "Common/Algorithms/SpectrumAnalyzer.h"
#include "Support/Signals.h"

namespace {

std::unique_ptr<SpectrumAnalyzer> Make(std::size_t channels, float window, float averageMs = 0.0f,
                                       float size = 2.0f) {
    auto analyzer = std::make_unique<SpectrumAnalyzer>();
    analyzer->SetChannelCount(channels);
    analyzer->Prepare(48000.0f, 512);
    analyzer->SetParameter(SpectrumAnalyzer::kSize, size);
    analyzer->SetParameter(SpectrumAnalyzer::kWindow, window);
    analyzer->SetParameter(SpectrumAnalyzer::kAverage, averageMs);
    return analyzer;
}

void Feed(SpectrumAnalyzer& analyzer, std::vector<std::vector<float>>& x, std::size_t block = 512) {
    for (std::size_t done = 0; done < x[0].size(); done += block) {
        std::vector<float*> p;
        for (auto& ch : x) p.push_back(ch.data() + done);
        analyzer.Process(p.data(), std::min(block, x[0].size() - done));
    }
}

double Db(double power) { return 10.0 * std::log10(power); }

const char* kWindows[] = {"rectangular", "Hann", "Blackman-Harris", "flat top"};

}  // namespace

TEST(SpectrumAnalyzer, TonesAndTheirBandsReadTheirLevelWithEveryWindow) {
    // A -6 dBFS tone on bin 100 of 4096 reads -6 dB there with every window,
    // and -6 dB in its third-octave band (1172 Hz: the 1250 Hz band); off
    // the bins, the flat top still reads it within 0.02 dB.
    const double rate = 48000.0;
    for (int window = 0; window < 4; ++window) {
        auto analyzer = Make(1, static_cast<float>(window));
        const double f = 100.0 * rate / 4096.0;
        std::vector<std::vector<float>> x{zentest::Sine(f, rate, 16384, 0.5)};
        Feed(*analyzer, x);
        EXPECT_NEAR(Db(analyzer->Spectrum(0)[100]), -6.02, 0.01) << kWindows[window];
        EXPECT_NEAR(Db(analyzer->Bands(0)[18]), -6.02, 0.05) << kWindows[window];
        EXPECT_LT(Db(analyzer->Bands(0)[14]), -40.0) << kWindows[window];  // 500 Hz, well away

        auto between = Make(1, static_cast<float>(window));
        std::vector<std::vector<float>> y{zentest::Sine(100.5 * rate / 4096.0, rate, 16384, 0.5)};
        Feed(*between, y);
        const double crest = std::max(Db(between->Spectrum(0)[100]), Db(between->Spectrum(0)[101]));
        if (window == SpectrumAnalyzer::kFlatTop) {
            EXPECT_NEAR(crest, -6.02, 0.02);
        }
        // The rectangle's slow side lobes carry a tenth of a dB out of the band.
        EXPECT_NEAR(Db(between->Bands(0)[18]), -6.02, window == SpectrumAnalyzer::kRectangular ? 0.2 : 0.05)
            << kWindows[window];
    }
    // DC reads its level too.
    auto analyzer = Make(1, SpectrumAnalyzer::kHann);
    std::vector<std::vector<float>> dc{std::vector<float>(8192, 0.25f)};
    Feed(*analyzer, dc);
    EXPECT_NEAR(Db(analyzer->Spectrum(0)[0]), 20.0 * std::log10(0.25), 0.01);
}

TEST(SpectrumAnalyzer, SummedViewIsTheMeanOfTheChannels) {
    const std::vector<float> tone = zentest::Sine(1000.0, 48000.0, 16384, 0.5);
    const std::vector<float> silence(tone.size(), 0.0f);
    auto perChannel = Make(2, SpectrumAnalyzer::kBlackmanHarris);
    auto summed = Make(2, SpectrumAnalyzer::kBlackmanHarris);
    summed->SetParameter(SpectrumAnalyzer::kMode, SpectrumAnalyzer::kSummed);
    EXPECT_EQ(perChannel->Rows(), 2u);
    EXPECT_EQ(summed->Rows(), 1u);
    std::vector<std::vector<float>> x{tone, silence};
    Feed(*perChannel, x);
    Feed(*summed, x);
    for (std::size_t b = 0; b < zen::OctaveBands::kBands; ++b)
        EXPECT_FLOAT_EQ(summed->Bands(0)[b], 0.5f * perChannel->Bands(0)[b]) << b;
    EXPECT_EQ(perChannel->Bands(1)[17], 0.0f);
}

TEST(SpectrumAnalyzer, AveragesOverItsTimeAndLetsPeaksFallAtTheirRate) {
    // Frames of 4096 come every 1024 samples. A tone switched on reaches
    // 1 - 1/e of its power after the averaging time; switched off, the
    // held peak falls by the decay rate.
    const double rate = 48000.0;
    const double frameSeconds = 1024.0 / rate;
    auto analyzer = Make(1, SpectrumAnalyzer::kHann, 500.0f);
    analyzer->SetParameter(SpectrumAnalyzer::kDecay, 20.0f);
    const std::size_t frames = 25;  // 533 ms of frames, after the first full one
    std::vector<std::vector<float>> on{zentest::Sine(100.0 * rate / 4096.0, rate, 4096 + 1024 * frames, 0.5)};
    Feed(*analyzer, on, 1024);
    const double reached = analyzer->Spectrum(0)[100] / 0.25;
    EXPECT_NEAR(reached, 1.0 - std::exp(-frameSeconds * (frames + 1) / 0.5), 0.02);
    // Once the tone has left the frames (4 of them), the peak falls alone.
    analyzer->SetParameter(SpectrumAnalyzer::kAverage, 0.0f);
    std::vector<std::vector<float>> off{std::vector<float>(1024 * 4, 0.0f)};
    Feed(*analyzer, off, 1024);
    EXPECT_LT(Db(analyzer->Spectrum(0)[100]), -100.0);
    const double held = Db(analyzer->PeakHold(0)[100]);
    off[0].assign(1024 * 47, 0.0f);
    Feed(*analyzer, off, 1024);
    EXPECT_NEAR(Db(analyzer->PeakHold(0)[100]), held - 20.0 * 47 * frameSeconds, 0.01);
}

TEST(SpectrumAnalyzer, FramesDoNotDependOnTheBlockSplitAndSkipBadSamples) {
    std::vector<float> noise = zentest::Noise(20000, 0.5, 5);
    std::vector<std::vector<float>> x{noise, zentest::Sine(3000.0, 48000.0, 20000, 0.3)};
    auto whole = Make(2, SpectrumAnalyzer::kBlackmanHarris, 200.0f, 1.0f);
    Feed(*whole, x, x[0].size());
    for (std::size_t block : {1u, 100u, 2047u}) {
        auto split = Make(2, SpectrumAnalyzer::kBlackmanHarris, 200.0f, 1.0f);
        Feed(*split, x, block);
        EXPECT_EQ(split->Frames(), whole->Frames());
        for (std::size_t k = 0; k < split->Bins(); ++k) ASSERT_EQ(split->Spectrum(1)[k], whole->Spectrum(1)[k]) << k;
    }
    // NaN and infinities read as silence.
    std::vector<std::vector<float>> dirty = x, clean = x;
    for (std::size_t n = 50; n < noise.size(); n += 1009) {
        dirty[0][n] = std::numeric_limits<float>::quiet_NaN();
        dirty[1][n] = -std::numeric_limits<float>::infinity();
        clean[0][n] = clean[1][n] = 0.0f;
    }
    auto a = Make(2, SpectrumAnalyzer::kHann);
    auto b = Make(2, SpectrumAnalyzer::kHann);
    Feed(*a, dirty);
    Feed(*b, clean);
    for (std::size_t k = 0; k < a->Bins(); ++k) ASSERT_EQ(a->Spectrum(0)[k], b->Spectrum(0)[k]) << k;
    // A new size takes effect at once, starting its averages afresh.
    a->SetParameter(SpectrumAnalyzer::kSize, 5.0f);
    EXPECT_EQ(a->Size(), 32768u);
    EXPECT_EQ(a->Spectrum(0)[10], 0.0f);
}
