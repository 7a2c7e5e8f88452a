// The spectral denoiser on spoken phrases in four kinds of noise, and as a
// stream: latency, block splits, bad input, listening to what is removed.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>

#include "Common/NoiseReduction/DenoiseRig.h"
#include "Common/NoiseReduction/zn_denoiser.h"
#include "Support/Signals.h"
#include "Support/SpeechQuality.h"
#include "Support/SpokenSpeech.h"

namespace nr = zen::noise_reduction;
using zentest::NoiseKind;

namespace {

constexpr double kRate = 48000.0;
constexpr double kLeadSeconds = 0.5;  // noise alone before the speech: the learnt region

const std::vector<float>& Phrase() {
    static const std::vector<float> clean =
        zentest::SpeakPhrases({"The quick brown fox jumps over the lazy dog."}, kRate, kLeadSeconds);
    return clean;
}

nr::zn_denoise_settings Settings(nr::zn_denoise_settings::Estimate estimate) {
    nr::zn_denoise_settings s;
    s.estimate = estimate;
    s.floor = 0.1f;  // 20 dB
    return s;
}

// Runs `count` samples through in blocks of the given sizes, cycling.
std::vector<float> Stream(nr::zn_denoiser& d, std::vector<float> x, const std::vector<std::size_t>& blocks) {
    for (std::size_t done = 0, i = 0; done < x.size(); ++i) {
        const std::size_t n = std::min(blocks[i % blocks.size()], x.size() - done);
        float* channels[] = {x.data() + done};
        d.Process(channels, n);
        done += n;
    }
    return x;
}

void Prepare(nr::zn_denoiser& d, std::uint64_t channels, double rate, const nr::zn_denoise_settings& s) {
    d.SetChannelCount(channels);
    ASSERT_TRUE(d.Prepare(static_cast<float>(rate), 4096));
    d.Configure(s);
}

}  // namespace

struct QualityCase {
    NoiseKind kind;
    double minImprovementDb;  // SI-SDR, at every SNR and both estimates
};

class zn_denoiserQuality : public ::testing::TestWithParam<QualityCase> {};

// SNR, segmental SNR and SI-SDR all improve at 0, 5 and 10 dB input SNR,
// with the learnt profile and with the adaptive estimate; the speech passed
// through the same gains keeps an SI-SDR well above the noisy input's.
TEST_P(zn_denoiserQuality, ImprovesSpokenPhrase) {
    const std::vector<float>& clean = Phrase();
    ASSERT_FALSE(clean.empty()) << "espeak-ng could not be run (scripts/install-deps.sh installs it)";
    const QualityCase c = GetParam();
    const std::vector<float> noise = zentest::MakeNoise(c.kind, clean.size(), kRate);
    for (double snr : {0.0, 5.0, 10.0}) {
        const std::vector<float> noisy = zentest::MixAtSnr(clean, noise, snr);
        const double inSi = zentest::SiSdrDb(noisy, clean);
        for (auto estimate : {nr::zn_denoise_settings::Estimate::Adaptive, nr::zn_denoise_settings::Estimate::Learned}) {
            const bool learned = estimate == nr::zn_denoise_settings::Estimate::Learned;
            const zentest::Denoised d = zentest::RunDenoiser(noisy, kRate, Settings(estimate),
                                                             learned ? static_cast<std::size_t>(kLeadSeconds * kRate) : 0);
            const std::vector<float> speech = zentest::ApplyGains(clean, kRate, d.gains);
            const double si = zentest::SiSdrDb(d.output, clean) - inSi;
            const double snrGain = zentest::SnrDb(d.output, clean) - zentest::SnrDb(noisy, clean);
            const double seg = zentest::SegmentalSnrDb(d.output, clean, kRate) - zentest::SegmentalSnrDb(noisy, clean, kRate);
            const double speechSi = zentest::SiSdrDb(speech, clean);
            const std::string what = std::string(zentest::NoiseName(c.kind)) + " noise at " + std::to_string(snr) +
                                     " dB, " + (learned ? "learnt" : "adaptive");
            EXPECT_GT(si, c.minImprovementDb) << what;
            EXPECT_GT(snrGain, 0.5 * c.minImprovementDb) << what;
            EXPECT_GT(seg, 0.0) << what;
            EXPECT_GT(speechSi, inSi + 3.0) << what;
        }
    }
}

INSTANTIATE_TEST_SUITE_P(Noises, zn_denoiserQuality,
                         ::testing::Values(QualityCase{NoiseKind::White, 5.0}, QualityCase{NoiseKind::Pink, 2.5},
                                           QualityCase{NoiseKind::Babble, 2.0}, QualityCase{NoiseKind::Hum, 3.5}),
                         [](const auto& row) { return std::string(zentest::NoiseName(row.param.kind)); });

// On white noise alone the residual is near the floor, not a field of
// isolated peaks: far fewer than plain spectral subtraction leaves (given
// the true noise power and the same floor), near the noise's own count.
TEST(zn_denoiser, LeavesFewIsolatedPeaksInWhiteNoise) {
    std::vector<float> noise = zentest::MakeNoise(NoiseKind::White, static_cast<std::size_t>(3 * kRate), kRate);
    for (float& v : noise) v *= 0.03f;
    const std::size_t settle = static_cast<std::size_t>(kRate);
    const auto tail = [&](const std::vector<float>& x) { return std::vector<float>(x.begin() + settle, x.end()); };
    const double baseline = zentest::IsolatedPeaksPerSecond(tail(zentest::SpectralSubtraction(noise, noise, kRate, 0.1f)), kRate);
    const double input = zentest::IsolatedPeaksPerSecond(tail(noise), kRate);
    for (auto estimate : {nr::zn_denoise_settings::Estimate::Adaptive, nr::zn_denoise_settings::Estimate::Learned}) {
        const zentest::Denoised d = zentest::RunDenoiser(noise, kRate, Settings(estimate), settle / 2);
        const std::vector<float> out = tail(d.output);
        const double peaks = zentest::IsolatedPeaksPerSecond(out, kRate);
        EXPECT_LT(peaks, 0.25 * baseline) << "spectral subtraction " << baseline << "/s, the noise itself " << input << "/s";
        EXPECT_LT(peaks, 2.0 * input) << "the noise itself " << input << "/s";
        EXPECT_NEAR(zentest::ToDb(zentest::Rms(out) / zentest::Rms(tail(noise))), -20.0, 3.0) << "the floor";
    }
}

// Amount 0 gives the input back, delayed by the frame minus one sample, at
// every rate; the cleaned signal and the removed part add up to the input.
TEST(zn_denoiser, ReconstructsTheDelayedInputAndItsComplement) {
    for (double rate : {44100.0, 48000.0, 96000.0}) {
        std::vector<float> input = zentest::Noise(static_cast<std::size_t>(0.5 * rate), 0.5, 9);
        for (std::size_t i = 0; i < input.size(); ++i) input[i] += 0.3f * std::sin(0.01f * static_cast<float>(i));
        nr::zn_denoise_settings s = Settings(nr::zn_denoise_settings::Estimate::Adaptive);
        s.amount = 0.0f;
        nr::zn_denoiser d;
        Prepare(d, 1, rate, s);
        const std::size_t latency = d.Latency();
        EXPECT_EQ(latency + 1, nr::zn_stft::FrameLengthFor(rate));
        EXPECT_LE(latency, static_cast<std::size_t>(0.025 * rate)) << "about 21 ms";
        const std::vector<float> through = Stream(d, input, {512});
        float error = 0.0f;
        for (std::size_t i = latency; i < input.size(); ++i) error = std::max(error, std::fabs(through[i] - input[i - latency]));
        EXPECT_LT(error, 1e-5f) << rate << " Hz";

        s.amount = 1.0f;
        nr::zn_denoiser cleaned, removed;
        Prepare(cleaned, 1, rate, s);
        s.listenToRemoved = true;
        Prepare(removed, 1, rate, s);
        const std::vector<float> a = Stream(cleaned, input, {512}), b = Stream(removed, input, {512});
        error = 0.0f;
        for (std::size_t i = latency; i < input.size(); ++i) error = std::max(error, std::fabs(a[i] + b[i] - input[i - latency]));
        EXPECT_LT(error, 1e-5f) << rate << " Hz";
        EXPECT_GT(zentest::Rms(b), 0.1 * zentest::Rms(input)) << "something is removed";
    }
}

// The same stream in any split gives the same output, also voice guided
// (the detector runs sample for sample ahead of each frame).
TEST(zn_denoiser, OutputDoesNotDependOnTheBlockSplit) {
    std::vector<float> input = zentest::Noise(static_cast<std::size_t>(kRate), 0.1, 4);
    const std::vector<float>& speech = Phrase();
    for (std::size_t i = 0; i < input.size() && i < speech.size(); ++i) input[i] += speech[i + speech.size() / 3];
    for (bool guided : {false, true}) {
        nr::zn_denoise_settings s = Settings(nr::zn_denoise_settings::Estimate::Adaptive);
        s.voiceGuided = guided;
        s.speechFloor = 0.5f;
        std::vector<float> reference;
        for (const std::vector<std::size_t>& blocks : std::vector<std::vector<std::size_t>>{{4096}, {1}, {17, 300, 1, 999}}) {
            nr::zn_denoiser d;
            Prepare(d, 1, kRate, s);
            const std::vector<float> out = Stream(d, input, blocks);
            if (reference.empty()) {
                reference = out;
                continue;
            }
            float difference = 0.0f;
            for (std::size_t i = 0; i < out.size(); ++i) difference = std::max(difference, std::fabs(out[i] - reference[i]));
            EXPECT_EQ(difference, 0.0f) << "blocks of " << blocks[0] << ", guided " << guided;
        }
    }
}

// Silence, DC, full-scale noise and bursts of NaN and infinity never give a
// non-finite sample, and the denoiser is not stuck afterwards: noise that
// follows is reduced as by a fresh instance.
TEST(zn_denoiser, SurvivesBadInput) {
    const std::size_t n = static_cast<std::size_t>(kRate / 2);
    std::vector<float> bad(n, 0.0f);
    bad.insert(bad.end(), n, 0.5f);
    const std::vector<float> loud = zentest::Noise(n, 1.0, 5);
    bad.insert(bad.end(), loud.begin(), loud.end());
    for (std::size_t i = 0; i < 2000; ++i)
        bad.push_back(i % 3 == 0 ? NAN : (i % 3 == 1 ? INFINITY : -INFINITY));
    std::vector<float> after = zentest::Noise(static_cast<std::size_t>(2 * kRate), 0.05, 6);
    nr::zn_denoise_settings s = Settings(nr::zn_denoise_settings::Estimate::Adaptive);
    for (bool guided : {false, true}) {
        s.voiceGuided = guided;
        nr::zn_denoiser d, fresh;
        Prepare(d, 2, kRate, s);
        Prepare(fresh, 2, kRate, s);
        std::vector<float> left = bad, right = bad;
        left.insert(left.end(), after.begin(), after.end());
        right.insert(right.end(), after.begin(), after.end());
        float* channels[] = {left.data(), right.data()};
        for (std::size_t done = 0; done < left.size(); done += 512) {
            float* block[] = {channels[0] + done, channels[1] + done};
            d.Process(block, std::min<std::size_t>(512, left.size() - done));
        }
        for (std::size_t i = 0; i < left.size(); ++i) ASSERT_TRUE(std::isfinite(left[i])) << i;
        std::vector<float> ref = after, ref2 = after;
        float* fc[] = {ref.data(), ref2.data()};
        fresh.Process(fc, ref.size());
        const std::size_t last = static_cast<std::size_t>(kRate / 2);
        const double reduced = zentest::Rms(left, left.size() - last), expected = zentest::Rms(ref, ref.size() - last);
        EXPECT_NEAR(zentest::ToDb(reduced / expected), 0.0, 1.0) << "guided " << guided;
        EXPECT_LT(zentest::ToDb(reduced / 0.05 * std::sqrt(3.0)), -12.0) << "guided " << guided;
    }
}

// Voice guided: the pauses go down to the floor outside speech, while the
// speech is treated nearly as gently as by a plain run at the speech floor.
TEST(zn_denoiser, VoiceGuidanceSuppressesPausesHarder) {
    const std::vector<float>& clean = Phrase();
    ASSERT_FALSE(clean.empty());
    const std::vector<float> noisy = zentest::MixAtSnr(clean, zentest::MakeNoise(NoiseKind::Pink, clean.size(), kRate), 10.0);
    nr::zn_denoise_settings s = Settings(nr::zn_denoise_settings::Estimate::Adaptive);
    s.voiceGuided = true;
    s.floor = 0.01f;       // 40 dB in pauses
    s.speechFloor = 0.3f;  // 10 dB in speech
    const zentest::Denoised guided = zentest::RunDenoiser(noisy, kRate, s);
    s.voiceGuided = false;
    s.floor = s.speechFloor;
    s.speechFloorLift = 0.0f;  // the speech floor as it stands, not lifted
    const zentest::Denoised plain = zentest::RunDenoiser(noisy, kRate, s);
    // The tail is a pause.
    const std::size_t pause = static_cast<std::size_t>(0.4 * kRate), end = noisy.size();
    const double noiseIn = zentest::Rms(noisy, end - pause, end);
    const double guidedPause = zentest::ToDb(zentest::Rms(guided.output, end - pause, end) / noiseIn);
    EXPECT_LT(guidedPause, -30.0);
    EXPECT_LT(guidedPause, zentest::ToDb(zentest::Rms(plain.output, end - pause, end) / noiseIn) - 15.0);
    const std::vector<float> speech = zentest::ApplyGains(clean, kRate, guided.gains);
    const std::vector<float> plainSpeech = zentest::ApplyGains(clean, kRate, plain.gains);
    EXPECT_GT(zentest::SiSdrDb(speech, clean), zentest::SiSdrDb(plainSpeech, clean) - 2.0) << "speech nearly as natural";
}

// Not voice guided, the floor up to 4 kHz rises under speech by the set
// share of its depth and no further, while noise alone still rests at the
// floor and the gains above 8 kHz are untouched: the speech through the
// gains gains in SI-SDR, the noise before it does not.
TEST(zn_denoiser, SpeechLiftsTheFloorNoiseAloneDoesNot) {
    const std::vector<float>& clean = Phrase();
    ASSERT_FALSE(clean.empty());
    const std::vector<float> noisy = zentest::MixAtSnr(clean, zentest::MakeNoise(NoiseKind::Pink, clean.size(), kRate), 5.0);
    nr::zn_denoise_settings s = Settings(nr::zn_denoise_settings::Estimate::Adaptive);
    const float lifted = std::pow(s.floor, 1.0f - s.speechFloorLift);
    const zentest::Denoised lift = zentest::RunDenoiser(noisy, kRate, s);
    s.speechFloorLift = 0.0f;
    const zentest::Denoised plain = zentest::RunDenoiser(noisy, kRate, s);

    const double binHz = kRate / 1024.0;
    const auto voiceTop = static_cast<std::ptrdiff_t>(nr::zn_denoise_frame::kVoiceBandHz[1] / binHz);
    const auto high = static_cast<std::ptrdiff_t>(8000.0 / binHz);
    const auto least = [](auto begin, auto end) { return *std::min_element(begin, end); };
    const std::size_t hop = 256, noiseBegin = static_cast<std::size_t>(0.3 * kRate) / hop,
                      noiseEnd = static_cast<std::size_t>(kLeadSeconds * kRate) / hop - 1;
    float highest = 0.0f;
    for (std::size_t f = noiseBegin; f < lift.gains.size(); ++f) {  // the estimate has settled
        const std::vector<float>& g = lift.gains[f];
        const float voice = least(g.begin(), g.begin() + voiceTop);
        highest = std::max(highest, voice);
        ASSERT_GE(voice, 0.999f * s.floor) << f;
        ASSERT_LE(voice, 1.001f * lifted) << f;
        ASSERT_TRUE(std::equal(g.begin() + high, g.end(), plain.gains[f].begin() + high)) << f;
        for (std::size_t k = 0; k < g.size(); ++k) ASSERT_GE(g[k], plain.gains[f][k] - 1e-6f) << f << " " << k;
        if (f >= noiseBegin && f < noiseEnd) {
            EXPECT_LE(voice, 1.12f * s.floor) << "noise alone, frame " << f;
        }
    }
    EXPECT_GT(highest, 0.99f * lifted) << "speech lifts the floor all the way";

    const std::size_t lead = static_cast<std::size_t>(0.3 * kRate), leadEnd = static_cast<std::size_t>(0.45 * kRate);
    EXPECT_NEAR(zentest::ToDb(zentest::Rms(lift.output, lead, leadEnd) / zentest::Rms(plain.output, lead, leadEnd)), 0.0, 0.5);
    const double liftSi = zentest::SiSdrDb(zentest::ApplyGains(clean, kRate, lift.gains), clean);
    const double plainSi = zentest::SiSdrDb(zentest::ApplyGains(clean, kRate, plain.gains), clean);
    EXPECT_GT(liftSi, plainSi + 1.0);
}
