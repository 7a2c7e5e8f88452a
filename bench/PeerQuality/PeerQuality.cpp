// The quality half of the peer comparison (bench/peers.sh): writes the test
// material, built here so every run compares the same files, and reads the
// figures that matter per job from rendered files. Not part of make test or
// make bench.
//
//   ZenPeerQuality material FOLDER          pink, music, speech, impulse, tone (48 kHz stereo float)
//   ZenPeerQuality truepeak CEILING FILE    true peak (dBTP) and 10 ms windows over the ceiling
//   ZenPeerQuality t60 SECONDS FILE         decay time of an impulse response and its error
//   ZenPeerQuality bands FILE               sibilant and voiced band change against speech.wav beside it
//   ZenPeerQuality pitch SEMITONES IN OUT   pitch error (cents) and alignment (samples) of a tone
//
// Each figure command prints one line of tab-separated fields.
#include <sndfile.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <vector>

#include "Support/DecayAnalysis.h"
#include "Support/OversampledPeak.h"
#include "Support/Signals.h"
#include "Support/Speech.h"

namespace {

constexpr double kRate = 48000.0;
constexpr std::size_t kSeconds = 30;
constexpr double kToneFrequency = 440.0;
constexpr double kToneOn = 0.5, kTonePeriod = 1.0;  // seconds
constexpr std::size_t kWindow = 480;                // 10 ms at 48 kHz

using Channels = std::vector<std::vector<float>>;

bool Write(const std::string& path, const Channels& channels) {
    SF_INFO info{};
    info.samplerate = static_cast<int>(kRate);
    info.channels = static_cast<int>(channels.size());
    info.format = SF_FORMAT_WAV | SF_FORMAT_FLOAT;
    SNDFILE* file = sf_open(path.c_str(), SFM_WRITE, &info);
    if (file == nullptr) return false;
    sf_command(file, SFC_SET_CLIPPING, nullptr, SF_FALSE);
    const std::size_t frames = channels[0].size();
    std::vector<float> interleaved(frames * channels.size());
    for (std::size_t n = 0; n < frames; ++n)
        for (std::size_t c = 0; c < channels.size(); ++c) interleaved[n * channels.size() + c] = channels[c][n];
    const bool ok = sf_writef_float(file, interleaved.data(), static_cast<sf_count_t>(frames)) ==
                    static_cast<sf_count_t>(frames);
    return sf_close(file) == 0 && ok;
}

Channels Read(const std::string& path) {
    SF_INFO info{};
    SNDFILE* file = sf_open(path.c_str(), SFM_READ, &info);
    if (file == nullptr) {
        std::fprintf(stderr, "ZenPeerQuality: cannot read %s: %s\n", path.c_str(), sf_strerror(nullptr));
        std::exit(1);
    }
    std::vector<float> interleaved(static_cast<std::size_t>(info.frames * info.channels));
    sf_readf_float(file, interleaved.data(), info.frames);
    sf_close(file);
    const auto count = static_cast<std::size_t>(info.channels);
    Channels channels(count, std::vector<float>(static_cast<std::size_t>(info.frames)));
    for (std::size_t n = 0; n < channels[0].size(); ++n)
        for (std::size_t c = 0; c < count; ++c) channels[c][n] = interleaved[n * count + c];
    return channels;
}

std::vector<float> Scaled(std::vector<float> x, double gain) {
    for (float& v : x) v = static_cast<float>(v * gain);
    return x;
}

// Tone bursts: the pitch is read on the bursts, the alignment on their edges.
std::vector<float> ToneBursts(std::size_t frames) {
    std::vector<float> x(frames);
    for (std::size_t n = 0; n < frames; ++n) {
        const double t = static_cast<double>(n) / kRate;
        if (std::fmod(t, kTonePeriod) < kToneOn) x[n] = static_cast<float>(0.5 * std::sin(2.0 * M_PI * kToneFrequency * t));
    }
    return x;
}

int Material(const std::string& folder) {
    const std::size_t frames = kSeconds * static_cast<std::size_t>(kRate);
    // Pink noise 12 dB over full scale at its peaks: what a limiter meets on a hot master.
    const double hot = std::pow(10.0, 12.0 / 20.0);
    const Channels pink = {Scaled(zentest::PinkNoise(frames, 5), hot), Scaled(zentest::PinkNoise(frames, 6), hot)};
    std::vector<float> music = zentest::MusicLike(kRate, frames);
    music = Scaled(music, hot / zentest::Peak(music));
    const zentest::SpeechLike speech = zentest::MakeSpeechLike(kRate, 24);
    std::vector<float> impulse = zentest::Impulse(8 * static_cast<std::size_t>(kRate), static_cast<std::size_t>(0.1 * kRate));
    const std::vector<float> tone = ToneBursts(10 * static_cast<std::size_t>(kRate));
    const bool ok = Write(folder + "/pink.wav", pink) && Write(folder + "/music.wav", {music, music}) &&
                    Write(folder + "/speech.wav", {speech.samples, speech.samples}) &&
                    Write(folder + "/impulse.wav", {impulse, impulse}) && Write(folder + "/tone.wav", {tone, tone});
    if (!ok) std::fprintf(stderr, "ZenPeerQuality: cannot write the material in %s\n", folder.c_str());
    return ok ? 0 : 1;
}

int TruePeak(double ceilingDb, const std::string& path) {
    const zentest::OversampledPeak check;
    const double ceiling = std::pow(10.0, ceilingDb / 20.0);
    double peak = 0.0;
    std::size_t over = 0, windows = 0;
    for (const std::vector<float>& channel : Read(path)) {
        for (std::size_t begin = 0; begin < channel.size(); begin += kWindow, ++windows) {
            const double p = check.Measure(channel, begin, std::min(channel.size(), begin + kWindow));
            peak = std::max(peak, p);
            if (p > ceiling) ++over;
        }
    }
    std::printf("%+.2f dBTP\t%zu of %zu\n", zentest::ToDb(peak), over, windows);
    return 0;
}

int DecayTime(double seconds, const std::string& path) {
    const double t60 = zentest::DecayTime(Read(path)[0], kRate);
    std::printf("%.2f s\t%+.0f %%\n", t60, 100.0 * (t60 / seconds - 1.0));
    return 0;
}

int Bands(const std::string& path) {
    // The same speech as speech.wav beside the rendered file, for its regions.
    const zentest::SpeechLike speech = zentest::MakeSpeechLike(kRate, 24);
    const std::vector<float> out = Read(path)[0];
    const auto change = [&](double low, double high, const std::vector<zentest::Region>& regions) {
        return 10.0 * std::log10(zentest::BandEnergy(out, kRate, low, high, regions) /
                                 zentest::BandEnergy(speech.samples, kRate, low, high, regions));
    };
    std::printf("sibilant %+.1f dB\tvoiced %+.1f dB\n", change(4000.0, 12000.0, speech.sibilants),
                change(100.0, 3000.0, speech.vowels));
    return 0;
}

// Frequency of the middle of the second burst from its zero crossings,
// interpolated between samples.
double BurstFrequency(const std::vector<float>& x, std::size_t begin, std::size_t end) {
    double first = -1.0, last = -1.0;
    int crossings = 0;
    for (std::size_t n = begin + 1; n < end && n < x.size(); ++n) {
        if (x[n - 1] < 0.0f && x[n] >= 0.0f) {
            const double at = static_cast<double>(n - 1) + x[n - 1] / (x[n - 1] - x[n]);
            if (first < 0.0) first = at;
            last = at;
            ++crossings;
        }
    }
    return crossings > 1 ? (crossings - 1) * kRate / (last - first) : 0.0;
}

int Pitch(double semitones, const std::string& inPath, const std::string& outPath) {
    const std::vector<float> in = Read(inPath)[0];
    const std::vector<float> out = Read(outPath)[0];
    const double lag = zentest::EnvelopeLag(in, out, static_cast<int>(0.2 * kRate), 240);
    // The second burst, its middle 0.3 s, wherever the output put it.
    const auto begin = static_cast<std::size_t>(std::max(0.0, (kTonePeriod + 0.1) * kRate + lag));
    const auto end = begin + static_cast<std::size_t>(0.3 * kRate);
    const double expected = kToneFrequency * std::pow(2.0, semitones / 12.0);
    const double found = BurstFrequency(out, begin, end);
    std::printf("%+.2f cents\t%+.0f samples\n", found > 0.0 ? 1200.0 * std::log2(found / expected) : NAN, lag);
    return 0;
}

}  // namespace

int main(int argc, char** argv) {
    const std::vector<std::string> args(argv + 1, argv + argc);
    if (args.size() == 2 && args[0] == "material") return Material(args[1]);
    if (args.size() == 3 && args[0] == "truepeak") return TruePeak(std::atof(args[1].c_str()), args[2]);
    if (args.size() == 3 && args[0] == "t60") return DecayTime(std::atof(args[1].c_str()), args[2]);
    if (args.size() == 2 && args[0] == "bands") return Bands(args[1]);
    if (args.size() == 4 && args[0] == "pitch") return Pitch(std::atof(args[1].c_str()), args[2], args[3]);
    std::fprintf(stderr,
                 "usage: ZenPeerQuality material FOLDER | truepeak CEILING FILE | t60 SECONDS FILE | bands FILE |"
                 " pitch SEMITONES IN OUT\n");
    return 2;
}
