#include <gtest/gtest.h>

#include "Common/NoiseReduction/zn_voice_activity.h"
#include "Support/SpokenSpeech.h"

namespace nr = zen::noise_reduction;

// At rates the detector does not take itself, the stream is resampled to
// 16 kHz: one decision per 10 ms whatever the rate; speech raises the
// probability, the pauses between phrases let it fall to 0.
TEST(zn_voice_activity, FollowsSpokenPhrasesAtAnyRate) {
    for (double rate : {44100.0, 96000.0}) {
        const double gap = 0.8;
        const std::vector<float> speech = zentest::SpeakPhrases({"Hello there.", "Voices and pauses."}, rate, gap);
        ASSERT_FALSE(speech.empty()) << "espeak-ng could not be run (scripts/install-deps.sh installs it)";
        nr::zn_voice_activity vad;
        ASSERT_TRUE(vad.Configure(rate, 512));
        const float* channels[] = {speech.data()};
        std::size_t voiced = 0, frames = 0, quietGap = 0;
        const auto gapSamples = static_cast<std::size_t>(gap * rate);
        for (std::size_t done = 0; done < speech.size(); done += 480) {
            const std::size_t n = std::min<std::size_t>(480, speech.size() - done);
            vad.Process(channels, 1, done, n);
            ++frames;
            voiced += vad.Probability() > 0.5f;
            // The last half of the leading pause.
            if (done > gapSamples / 2 && done + n < gapSamples) quietGap += vad.Probability() == 0.0f;
        }
        EXPECT_NEAR(static_cast<double>(vad.Decisions()), static_cast<double>(speech.size()) / rate * 100.0, 1.0) << rate;
        EXPECT_GT(voiced, frames / 4) << rate;
        EXPECT_LT(voiced, frames * 3 / 4) << rate;
        EXPECT_GT(quietGap, 0u) << rate;
    }
}
