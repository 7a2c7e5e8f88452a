// How far the "Limiter"'s output passes its ceiling between samples, Soft off
// and on: the output's true peak read 16 times per sample by the tests'
// independent checker, less the ceiling, over noises, music-like material,
// sines and any WAV files given (their first channel). Prints a Markdown
// table; --peak only reads the true peak of each file given (a limiter's
// output, say). Not part of make test or make bench.
//
//   cmake --build build --target ZenLimiterOvershoot
//   build/bin/ZenLimiterOvershoot [--ceiling dB] [file.wav ...]
//   build/bin/ZenLimiterOvershoot --peak file.wav ...
#include <sndfile.h>

#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <vector>

#include "Support/OversampledPeak.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

namespace {

constexpr double kRate = 48000.0;
constexpr std::size_t kFrames = 5 * 48000;

// Planar channels.
std::vector<std::vector<float>> Read(const std::string& path, double& rate) {
    SF_INFO info{};
    SNDFILE* file = sf_open(path.c_str(), SFM_READ, &info);
    if (file == nullptr) {
        std::fprintf(stderr, "error: %s: %s\n", path.c_str(), sf_strerror(nullptr));
        std::exit(1);
    }
    std::vector<float> interleaved(static_cast<std::size_t>(info.frames * info.channels));
    sf_readf_float(file, interleaved.data(), info.frames);
    sf_close(file);
    const auto channels = static_cast<std::size_t>(info.channels);
    std::vector<std::vector<float>> planar(channels, std::vector<float>(static_cast<std::size_t>(info.frames)));
    for (std::size_t n = 0; n < planar[0].size(); ++n)
        for (std::size_t c = 0; c < channels; ++c) planar[c][n] = interleaved[n * channels + c];
    rate = info.samplerate;
    return planar;
}

// Output true peak minus the ceiling, in dB.
double Overshoot(const std::vector<float>& input, double rate, float ceilingDb, float inputGainDb, bool soft) {
    zentest::PluginHarness plugin = zentest::Prepared(
        "Limiter", {{"Ceiling", ceilingDb}, {"Input Gain", inputGainDb}, {"Soft", soft ? 1.0f : 0.0f}}, 1,
        static_cast<float>(rate), 512);
    const std::vector<float> output = plugin.Run(input, 1, 512)[0];
    static const zentest::OversampledPeak check;
    const double peak = check.Measure(output, 0, output.size() - zentest::OversampledPeak::kHalfWidth);
    return 20.0 * std::log10(peak) - ceilingDb;
}

void Row(const std::string& name, const std::vector<float>& input, double rate, float ceilingDb, float gainDb) {
    std::printf("| %s | %+.1f dB | %+.2f | %+.2f |\n", name.c_str(), gainDb,
                Overshoot(input, rate, ceilingDb, gainDb, false), Overshoot(input, rate, ceilingDb, gainDb, true));
    std::fflush(stdout);
}

}  // namespace

int main(int argc, char** argv) {
    float ceilingDb = -1.0f;
    bool peakOnly = false;
    std::vector<std::string> files;
    for (int i = 1; i < argc; ++i) {
        const std::string argument = argv[i];
        if (argument == "--ceiling" && i + 1 < argc)
            ceilingDb = std::strtof(argv[++i], nullptr);
        else if (argument == "--peak")
            peakOnly = true;
        else
            files.push_back(argument);
    }
    if (peakOnly) {
        const zentest::OversampledPeak check;
        for (const std::string& path : files) {
            double rate = kRate;
            for (const std::vector<float>& channel : Read(path, rate))
                std::printf("%s: sample peak %+.2f dBFS, true peak %+.2f dBTP\n", path.c_str(),
                            zentest::ToDb(zentest::Peak(channel)), zentest::ToDb(check.Measure(channel)));
        }
        return 0;
    }
    std::printf("Output true peak (16x) less the ceiling of %.1f dBTP, in dB; 48 kHz unless a file says otherwise\n\n",
                ceilingDb);
    std::printf("| material | input gain | Soft off | Soft on |\n|---|---|---|---|\n");
    const std::vector<float> white = zentest::Noise(kFrames, 1.0, 3);
    const std::vector<float> pink = zentest::PinkNoise(kFrames, 5);
    const std::vector<float> music = zentest::MusicLike(kRate, kFrames);
    for (float gain : {0.0f, 6.0f, 12.0f}) Row("white noise, peak 0 dBFS", white, kRate, ceilingDb, gain);
    for (float gain : {0.0f, 12.0f}) Row("pink noise, peak 0 dBFS", pink, kRate, ceilingDb, gain);
    for (float gain : {0.0f, 6.0f}) Row("music-like, peak +3.5 dBFS", music, kRate, ceilingDb, gain);
    for (double frequency : {1000.0, 5000.0, 10000.0, 15000.0, 17000.0, 19000.0, 21000.0})
        for (float gain : {0.0f, 6.0f})
            Row("sine " + std::to_string(static_cast<int>(frequency)) + " Hz, peak 0 dBFS",
                zentest::Sine(frequency, kRate, kRate, 1.0, 0.7), kRate, ceilingDb, gain);
    for (const std::string& path : files) {
        double rate = kRate;
        const std::vector<float> input = Read(path, rate)[0];
        for (float gain : {0.0f, 6.0f, 12.0f}) Row(path, input, rate, ceilingDb, gain);
    }
    return 0;
}
