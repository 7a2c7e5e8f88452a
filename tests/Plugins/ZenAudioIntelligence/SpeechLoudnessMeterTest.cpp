// The per-entry speech loudness: spoken phrases read as speech at the level
// they are played, silence and sparse speech read as none.
#include <gtest/gtest.h>

#include <cmath>
#include <vector>

#include "Plugins/ZenAudioIntelligence/SpeechLoudnessMeter.h"
#include "Support/SpokenSpeech.h"
#include "zen/LevellerEngine.h"

namespace {

constexpr std::size_t kEntry = zen::levelling::kEntryFrames;

// The entries of `x` (stereo, both channels alike), block by block.
std::vector<SpeechLoudnessMeter::Entry> Measure(const std::vector<float>& x, double rate, float gain = 1.0f) {
    SpeechLoudnessMeter meter;
    EXPECT_TRUE(meter.Prepare(rate));
    std::vector<SpeechLoudnessMeter::Entry> entries;
    std::vector<float> scaled(x.size());
    for (std::size_t i = 0; i < x.size(); ++i) scaled[i] = gain * x[i];
    for (std::size_t at = 0; at + kEntry <= scaled.size(); at += kEntry) {
        for (std::size_t b = 0; b < kEntry; b += 500)
            meter.Process(scaled.data() + at + b, scaled.data() + at + b, std::min<std::size_t>(500, kEntry - b));
        entries.push_back(meter.TakeEntry());
    }
    return entries;
}

}  // namespace

TEST(SpeechLoudnessMeter, SpeechFollowsItsLevelAndSilenceIsNone) {
    for (double rate : {48000.0, 44100.0}) {
        const std::vector<float> speech = zentest::Speak(
            "The levelling engine listens to every word and keeps the dialogue steady.", rate);
        ASSERT_FALSE(speech.empty()) << "espeak-ng is missing";
        const auto loud = Measure(speech, rate);
        const auto soft = Measure(speech, rate, 0.1f);  // -20 dB
        int both = 0;
        for (std::size_t e = 0; e < loud.size(); ++e) {
            if (loud[e].loudness == zen::levelling::kNoSpeech || soft[e].loudness == zen::levelling::kNoSpeech) continue;
            ++both;
            EXPECT_GT(loud[e].loudness, -40.0f);
            EXPECT_LT(loud[e].loudness, -5.0f);
            // Voiced frames may differ a little between the levels.
            EXPECT_NEAR(loud[e].loudness - soft[e].loudness, 20.0f, 1.0f) << "entry " << e << " at " << rate;
        }
        EXPECT_GE(both, static_cast<int>(loud.size()) / 2) << rate;

        const auto silence = Measure(std::vector<float>(4 * kEntry, 0.0f), rate);
        for (const auto& e : silence) {
            EXPECT_EQ(e.loudness, zen::levelling::kNoSpeech);
            EXPECT_EQ(e.voicedPerMille, 0);
        }
    }
}

TEST(SpeechLoudnessMeter, FewVoicedFramesOrAQuietEntryIsNoSpeech) {
    const double rate = 48000.0;
    const std::vector<float> speech = zentest::Speak("Dialogue.", rate);
    ASSERT_FALSE(speech.empty()) << "espeak-ng is missing";
    // A short word in a long entry of silence: under the 90 % the test asks.
    std::vector<float> sparse(kEntry, 0.0f);
    std::copy_n(speech.begin(), std::min(speech.size(), kEntry / 4), sparse.begin());
    SpeechLoudnessMeter meter;
    ASSERT_TRUE(meter.Prepare(rate));
    meter.SetSpeechFraction(90.0f);
    meter.Process(sparse.data(), nullptr, kEntry);
    const SpeechLoudnessMeter::Entry e = meter.TakeEntry();
    EXPECT_EQ(e.loudness, zen::levelling::kNoSpeech);
    EXPECT_GT(e.voicedPerMille, 0);
    EXPECT_LT(e.voicedPerMille, 900);

    // Loud enough to be voiced, below a floor raised to -20 LUFS.
    meter.SetSpeechFraction(10.0f);
    meter.SetSpeechFloor(-20.0f);
    std::vector<float> quiet(speech.begin(), speech.begin() + static_cast<std::ptrdiff_t>(std::min(speech.size(), kEntry)));
    for (float& s : quiet) s *= 0.1f;
    meter.Process(quiet.data(), nullptr, quiet.size());
    EXPECT_EQ(meter.TakeEntry().loudness, zen::levelling::kNoSpeech);
}
