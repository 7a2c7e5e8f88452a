// "De-Esser" through the host interface: what it does to speech, its meters,
// layouts and latency.
#include <gtest/gtest.h>

#include <cmath>

#include "Support/PluginHarness.h"
#include "Support/Signals.h"
#include "Support/Speech.h"

using zentest::PluginHarness;

namespace {

double Db(double energyRatio) { return 10.0 * std::log10(energyRatio); }

}  // namespace

TEST(ZenDeesser, ReducesSibilantsAndLeavesTheRestOfTheSpectrum) {
    for (float rate : {44100.0f, 48000.0f, 96000.0f}) {
        const zentest::SpeechLike speech = zentest::MakeSpeechLike(rate);
        PluginHarness plugin("De-Esser");
        plugin.Prepare(1, rate, 512);
        const std::vector<float> out = plugin.Run(speech.samples, 1, 512)[0];
        const auto change = [&](double low, double high, const std::vector<zentest::Region>& regions) {
            return Db(zentest::BandEnergy(out, rate, low, high, regions) /
                      zentest::BandEnergy(speech.samples, rate, low, high, regions));
        };
        std::vector<zentest::Region> everything = {{0, out.size()}};
        printf("%g: ess %.2f  vowels: %.2f %.2f %.2f %.2f all: %.2f %.2f %.2f\n", rate, change(5000, 9000, speech.sibilants),
               change(80, 500, speech.vowels), change(500, 1500, speech.vowels), change(1500, 3500, speech.vowels),
               change(3500, 5000, speech.vowels), change(80, 500, everything), change(500, 1500, everything),
               change(1500, 3500, everything));
    }
}
