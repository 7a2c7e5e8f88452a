// The fvad_* functions on real speech: espeak-ng phrases between pauses,
// with noise, decided frame by frame and compared with a ground truth gated
// by the clean speech's energy.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <vector>

#include "Support/SpokenSpeech.h"
#include "zen/fvad.h"

namespace {

constexpr int kRate = 16000;
constexpr std::size_t kFrame = 480;          // 30 ms
constexpr double kGateBelowLoudestDb = 45.0;  // a frame within this of the loudest frame is speech

std::vector<std::int16_t> ToPcm(const std::vector<float>& x, std::size_t from) {
    std::vector<std::int16_t> pcm(kFrame);
    for (std::size_t i = 0; i < kFrame; ++i)
        pcm[i] = static_cast<std::int16_t>(std::lround(std::clamp(x[from + i], -1.0f, 32767.0f / 32768.0f) * 32768.0f));
    return pcm;
}

// Ground truth: the clean frame's energy is within the gate of the loudest
// frame; a speech frame's two neighbours count as speech too (the onsets and
// tails of words are quiet but speech).
std::vector<bool> EnergyGate(const std::vector<float>& clean) {
    std::vector<double> energy;
    for (std::size_t i = 0; i + kFrame <= clean.size(); i += kFrame) {
        double e = 0.0;
        for (std::size_t j = i; j < i + kFrame; ++j) e += static_cast<double>(clean[j]) * clean[j];
        energy.push_back(e);
    }
    const double loudest = *std::max_element(energy.begin(), energy.end());
    const double gate = loudest * std::pow(10.0, -kGateBelowLoudestDb / 10.0);
    std::vector<bool> speech(energy.size(), false);
    for (std::size_t f = 0; f < energy.size(); ++f)
        if (energy[f] > gate)
            for (std::size_t g = f > 0 ? f - 1 : 0; g <= std::min(f + 1, energy.size() - 1); ++g) speech[g] = true;
    return speech;
}

double Agreement(const std::vector<float>& clean, const std::vector<float>& noisy, int mode) {
    Fvad* vad = fvad_new();
    EXPECT_NE(vad, nullptr);
    EXPECT_EQ(fvad_set_sample_rate(vad, kRate), 0);
    EXPECT_EQ(fvad_set_mode(vad, mode), 0);
    const std::vector<bool> truth = EnergyGate(clean);
    std::size_t agree = 0;
    for (std::size_t f = 0; f < truth.size(); ++f) {
        const std::vector<std::int16_t> pcm = ToPcm(noisy, f * kFrame);
        const int decision = fvad_process(vad, pcm.data(), kFrame);
        EXPECT_TRUE(decision == 0 || decision == 1);
        agree += (decision == 1) == truth[f];
    }
    fvad_free(vad);
    return static_cast<double>(agree) / static_cast<double>(truth.size());
}

}  // namespace

TEST(fvad, AgreesWithTheEnergyGateOnSpokenPhrasesInNoise) {
    const std::vector<float> clean = zentest::SpeakPhrases(
        {"The quick brown fox jumps over the lazy dog.", "Noise reduction keeps the voice natural.",
         "Seven silent seconds passed before the answer came."},
        kRate, 0.8);
    ASSERT_FALSE(clean.empty()) << "espeak-ng could not be run (scripts/install-deps.sh installs it)";
    for (int mode = 0; mode <= 3; ++mode)
        EXPECT_GE(Agreement(clean, clean, mode), 0.9) << "no noise, mode " << mode;
    // Every mode in moderate noise; at 10 dB SNR the modes that trade missed
    // speech for missed noise best.
    struct Case {
        zentest::NoiseKind kind;
        double snr;
        int mode;
    };
    std::vector<Case> cases;
    for (zentest::NoiseKind kind : {zentest::NoiseKind::White, zentest::NoiseKind::Pink}) {
        for (int mode = 0; mode <= 3; ++mode) cases.push_back({kind, 20.0, mode});
        cases.push_back({kind, 10.0, 1});
    }
    for (const Case& c : cases) {
        const std::vector<float> noisy =
            zentest::MixAtSnr(clean, zentest::MakeNoise(c.kind, clean.size(), kRate), c.snr);
        EXPECT_GE(Agreement(clean, noisy, c.mode), 0.9)
            << zentest::NoiseName(c.kind) << " noise at " << c.snr << " dB SNR, mode " << c.mode;
    }
}
