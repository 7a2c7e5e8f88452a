// LoudnessMeter against libebur128 (linked here only, as a yardstick) on
// recorded speech laid out as stereo and 5.1, and on synthetic 5.1
// programme at 48 and 44.1 kHz: integrated loudness and the largest
// short-term loudness within 0.05 LU, loudness range within 0.2 LU, true
// peaks within 0.1 dB.
//
// libebur128 takes a short-term window for the range every second where
// we take one every 100 ms: given the same windows, the ranges agree to
// 0.01 LU; on half a minute of sparse speech the two samplings alone can
// differ by half a LU, so the ranges themselves are compared over minutes.
#include <ebur128.h>
#include <gtest/gtest.h>
#include <sndfile.h>

#include <cmath>
#include <memory>
#include <string>

#include "Common/Algorithms/LoudnessMeter.h"
#include "Common/Algorithms/SpeakerLayout.h"
#include "Support/Signals.h"

namespace {

using Planar = std::vector<std::vector<float>>;

struct Readings {
    double integrated = 0.0, maxShortTerm = 0.0, range = 0.0;
    std::vector<double> truePeakDb;
    double finerMaxShortTerm = 0.0;           // ours: read every 5 ms
    double rangeOfWindowsEverySecond = 0.0;  // ours: libebur128's windows
};

// Reads after every 100 ms, where both meters have a short-term value;
// `full` false reads the range alone.
Readings Ours(const Planar& x, double rate, bool full) {
    LoudnessMeter meter;
    meter.SetChannelCount(x.size());
    meter.Prepare(static_cast<float>(rate), 4800);
    meter.SetTruePeakEnabled(full);
    const std::size_t hop = meter.HopLength();
    Readings r;
    r.maxShortTerm = -HUGE_VAL;
    zen::LoudnessRange everySecond;
    for (std::size_t done = 0; done < x[0].size(); done += hop) {
        const std::size_t n = std::min(hop, x[0].size() - done);
        std::vector<float*> pointers;
        for (const auto& ch : x) pointers.push_back(const_cast<float*>(ch.data()) + done);
        meter.Process(pointers.data(), n);
        if (n < hop) continue;
        r.maxShortTerm = std::max(r.maxShortTerm, meter.ShortTerm());
        if (meter.Hops() >= LoudnessMeter::kShortTermHops && meter.Hops() % 10 == 0)
            everySecond.AddShortTerm(zen::LoudnessHistogram::Power(meter.ShortTerm()));
    }
    r.integrated = meter.Integrated();
    r.range = meter.Range();
    r.finerMaxShortTerm = meter.MaxShortTerm();
    r.rangeOfWindowsEverySecond = everySecond.Range();
    for (std::size_t c = 0; c < x.size(); ++c) r.truePeakDb.push_back(20.0 * std::log10(meter.TruePeak(c)));
    return r;
}

Readings Reference(const Planar& x, double rate, bool full) {
    const auto channels = static_cast<unsigned>(x.size());
    const int mode = full ? EBUR128_MODE_I | EBUR128_MODE_S | EBUR128_MODE_LRA | EBUR128_MODE_TRUE_PEAK
                          : EBUR128_MODE_LRA;
    ebur128_state* state = ebur128_init(channels, static_cast<unsigned long>(rate), mode);
    if (channels == 6) {
        const int map[] = {EBUR128_LEFT, EBUR128_RIGHT, EBUR128_CENTER, EBUR128_UNUSED, EBUR128_LEFT_SURROUND,
                           EBUR128_RIGHT_SURROUND};
        for (unsigned c = 0; c < 6; ++c) ebur128_set_channel(state, c, map[c]);
    }
    const auto hop = static_cast<std::size_t>(rate / 10);
    std::vector<float> interleaved(hop * channels);
    Readings r;
    r.maxShortTerm = -HUGE_VAL;
    for (std::size_t done = 0; done < x[0].size(); done += hop) {
        const std::size_t n = std::min(hop, x[0].size() - done);
        for (std::size_t i = 0; i < n; ++i)
            for (unsigned c = 0; c < channels; ++c) interleaved[i * channels + c] = x[c][done + i];
        ebur128_add_frames_float(state, interleaved.data(), n);
        double shortTerm = 0.0;
        if (full && n == hop && ebur128_loudness_shortterm(state, &shortTerm) == EBUR128_SUCCESS)
            r.maxShortTerm = std::max(r.maxShortTerm, shortTerm);
    }
    ebur128_loudness_range(state, &r.range);
    if (full) {
        ebur128_loudness_global(state, &r.integrated);
        for (unsigned c = 0; c < channels; ++c) {
            double peak = 0.0;
            ebur128_true_peak(state, c, &peak);
            r.truePeakDb.push_back(20.0 * std::log10(peak));
        }
    }
    ebur128_destroy(&state);
    return r;
}

void ExpectAgreement(const Planar& x, double rate, const std::string& what) {
    const Readings ours = Ours(x, rate, true);
    const Readings reference = Reference(x, rate, true);
    EXPECT_NEAR(ours.integrated, reference.integrated, 0.05) << what;
    EXPECT_NEAR(ours.maxShortTerm, reference.maxShortTerm, 0.05) << what;
    EXPECT_NEAR(ours.finerMaxShortTerm, reference.maxShortTerm, 0.05) << what;
    EXPECT_GE(ours.finerMaxShortTerm, ours.maxShortTerm) << what;
    EXPECT_NEAR(ours.rangeOfWindowsEverySecond, reference.range, 0.01) << what;
    double largestTruePeakGap = 0.0;
    for (std::size_t c = 0; c < x.size(); ++c) {
        EXPECT_NEAR(ours.truePeakDb[c], reference.truePeakDb[c], 0.1) << what << ", channel " << c;
        largestTruePeakGap = std::max(largestTruePeakGap, std::fabs(ours.truePeakDb[c] - reference.truePeakDb[c]));
    }
    std::printf("%s: integrated %.3f / %.3f, max short-term %.3f (%.3f) / %.3f, range of the same windows %.3f / "
                "%.3f LU, true peaks within %.3f dB\n",
                what.c_str(), ours.integrated, reference.integrated, ours.maxShortTerm, ours.finerMaxShortTerm,
                reference.maxShortTerm, ours.rangeOfWindowsEverySecond, reference.range, largestTruePeakGap);
}

void ExpectRangeAgreement(const Planar& x, double rate, const std::string& what) {
    const double ours = Ours(x, rate, false).range;
    const double reference = Reference(x, rate, false).range;
    EXPECT_NEAR(ours, reference, 0.2) << what;
    std::printf("%s: range %.3f / %.3f LU\n", what.c_str(), ours, reference);
}

std::vector<float> ReadMono(const std::string& path) {
    SF_INFO info{};
    SNDFILE* file = sf_open(path.c_str(), SFM_READ, &info);
    if (file == nullptr || info.channels != 1) {
        ADD_FAILURE() << "cannot read " << path << " (scripts/install-deps.sh installs it)";
        if (file != nullptr) sf_close(file);
        return {};
    }
    std::vector<float> x(static_cast<std::size_t>(info.frames));
    sf_readf_float(file, x.data(), info.frames);
    sf_close(file);
    return x;
}

// Recorded speech (the ALSA channel announcements, 48 kHz): each channel
// speaks the phrases in its own order and at its own level, with pauses;
// `rounds` times each phrase, about 15 s a round.
Planar Speech(std::size_t channels, std::size_t rounds) {
    const char* names[] = {"Front_Left", "Front_Right", "Front_Center", "Rear_Left", "Rear_Right",
                           "Side_Left",  "Side_Right",  "Rear_Center",  "Noise"};
    std::vector<std::vector<float>> phrases;
    for (const char* name : names) phrases.push_back(ReadMono(std::string("/usr/share/sounds/alsa/") + name + ".wav"));
    Planar x(channels);
    for (std::size_t c = 0; c < channels; ++c) {
        const float gain = static_cast<float>(std::pow(10.0, -3.0 * static_cast<double>(c % 4) / 20.0));
        for (std::size_t k = 0; k < rounds * phrases.size(); ++k) {
            const std::vector<float>& phrase = phrases[(k * (c + 2) + c) % phrases.size()];
            for (float v : phrase) x[c].push_back(v * gain * (k % 3 == 0 ? 0.3f : 1.0f));
            x[c].resize(x[c].size() + 4800 * (1 + (k + c) % 5), 0.0f);
        }
    }
    std::size_t shortest = x[0].size();
    for (const auto& ch : x) shortest = std::min(shortest, ch.size());
    for (auto& ch : x) ch.resize(shortest);
    return x;
}

// Noise in bursts of changing level and colour on every channel.
Planar Programme(std::size_t channels, double rate, double seconds) {
    const auto frames = static_cast<std::size_t>(seconds * rate);
    Planar x(channels);
    for (std::size_t c = 0; c < channels; ++c) {
        x[c] = zentest::Noise(frames, 1.0, static_cast<std::uint32_t>(17 + c));
        double low = 0.0;
        const auto segment = static_cast<std::size_t>(0.7 * rate);
        for (std::size_t start = 0; start < frames; start += segment) {
            const std::size_t k = start / segment;
            const double gain = std::pow(10.0, (-12.0 - static_cast<double>((k * 7 + c * 3) % 25)) / 20.0);
            const double colour = 0.05 + 0.9 * static_cast<double>((k + c) % 4) / 3.0;
            for (std::size_t n = start; n < std::min(frames, start + segment); ++n) {
                low += colour * (x[c][n] - low);
                x[c][n] = static_cast<float>(low * gain);
            }
        }
    }
    return x;
}

}  // namespace

TEST(LoudnessMeterReference, AgreesWithLibebur128OnRecordedSpeech) {
    ExpectAgreement(Speech(2, 2), 48000.0, "speech, stereo");
    ExpectAgreement(Speech(6, 2), 48000.0, "speech, 5.1");
}

TEST(LoudnessMeterReference, AgreesWithLibebur128OnSyntheticProgramme) {
    ExpectAgreement(Programme(6, 48000.0, 20.0), 48000.0, "programme, 5.1, 48 kHz");
    ExpectAgreement(Programme(6, 44100.0, 20.0), 44100.0, "programme, 5.1, 44.1 kHz");
}

TEST(LoudnessMeterReference, RangesAgreeOverMinutesWhereTheWindowRatesNoLongerMatter) {
    ExpectRangeAgreement(Speech(2, 12), 48000.0, "speech, stereo, 3 minutes");
    ExpectRangeAgreement(Programme(6, 48000.0, 120.0), 48000.0, "programme, 5.1, 2 minutes");
}
