// Quality against a plain phase vocoder: each material is shifted up a
// fourth and back down, and the round trip is compared with the original by
// spectral convergence and log-spectral distance. Heap integration and the
// peak-locked vocoder must both come closer than the baseline.
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

void CompareWithBaseline(const char* material, const std::vector<float>& x) {
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
}

}  // namespace

TEST(PitchQuality, HarmonicToneBeatsThePlainVocoder) { CompareWithBaseline("tone", HarmonicTone(220.0, 10, kLength)); }

TEST(PitchQuality, ChirpBeatsThePlainVocoder) { CompareWithBaseline("chirp", Chirp(200.0, 2000.0, kLength)); }

TEST(PitchQuality, SpeechLikeMaterialBeatsThePlainVocoder) { CompareWithBaseline("speech-like", SpeechLike(kLength)); }

TEST(PitchQuality, TransientsBeatThePlainVocoder) { CompareWithBaseline("transients", Transients(kLength)); }
