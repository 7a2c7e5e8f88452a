// Quality against a plain phase vocoder: each material is shifted up a
// fourth and back down, and the round trip is compared with the original by
// spectral convergence and log-spectral distance. Heap integration and the
// peak-locked vocoder must both come closer than the baseline, and no worse
// than they do now (ceilings half a dB, or 0.05 dB of distance, above).
#include <gtest/gtest.h>

#include <cmath>
#include <cstdio>

#include "PitchMeasures.h"

using namespace zentest;

namespace {

constexpr std::size_t kLength = 48000;
constexpr std::size_t kSkip = 6000;  // edges, where the frames are not yet full
constexpr int kSemitones = 5;

std::vector<float> RoundTrip(const std::vector<float>& x, int algorithm) {
    ShifterSettings s;
    s.algorithm = algorithm;
    s.coarse = kSemitones;
    const auto up = Shift(x, s);
    s.coarse = -kSemitones;
    return Shift(up, s);
}

struct Ceiling {
    double pghiSc, pghiLsd, plpvSc, plpvLsd;
};

void CompareWithBaseline(const char* material, const std::vector<float>& x, const Ceiling& ceiling) {
    const double ratio = std::pow(2.0, kSemitones / 12.0);
    const Quality baseline = Compare(x, PlainVocoderShift(PlainVocoderShift(x, ratio), 1.0 / ratio), kSkip);
    const Quality pghi = Compare(x, RoundTrip(x, 1), kSkip);
    const Quality plpv = Compare(x, RoundTrip(x, 0), kSkip);
    std::printf("%-12s SC dB / LSD dB: PGHI %6.2f / %5.2f   PLPV %6.2f / %5.2f   plain PV %6.2f / %5.2f\n", material,
                pghi.spectralConvergenceDb, pghi.logSpectralDistanceDb, plpv.spectralConvergenceDb,
                plpv.logSpectralDistanceDb, baseline.spectralConvergenceDb, baseline.logSpectralDistanceDb);
    EXPECT_LT(pghi.spectralConvergenceDb, baseline.spectralConvergenceDb) << material;
    EXPECT_LT(plpv.spectralConvergenceDb, baseline.spectralConvergenceDb) << material;
    EXPECT_LT(pghi.logSpectralDistanceDb, baseline.logSpectralDistanceDb) << material;
    EXPECT_LT(plpv.logSpectralDistanceDb, baseline.logSpectralDistanceDb) << material;
    EXPECT_LT(pghi.spectralConvergenceDb, ceiling.pghiSc) << material;
    EXPECT_LT(pghi.logSpectralDistanceDb, ceiling.pghiLsd) << material;
    EXPECT_LT(plpv.spectralConvergenceDb, ceiling.plpvSc) << material;
    EXPECT_LT(plpv.logSpectralDistanceDb, ceiling.plpvLsd) << material;
}

}  // namespace

TEST(PitchQuality, HarmonicToneBeatsThePlainVocoder) {
    CompareWithBaseline("tone", HarmonicTone(220.0, 10, kLength), {-63.7, 0.15, -64.6, 0.14});
}

TEST(PitchQuality, ChirpBeatsThePlainVocoder) {
    CompareWithBaseline("chirp", Chirp(200.0, 2000.0, kLength), {-26.5, 0.25, -25.8, 0.12});
}

TEST(PitchQuality, SpeechLikeMaterialBeatsThePlainVocoder) {
    CompareWithBaseline("speech-like", SpeechLike(kLength), {-13.0, 2.46, -13.1, 3.26});
}

TEST(PitchQuality, TransientsBeatThePlainVocoder) {
    CompareWithBaseline("transients", Transients(kLength), {-7.8, 4.39, -5.3, 6.09});
}
