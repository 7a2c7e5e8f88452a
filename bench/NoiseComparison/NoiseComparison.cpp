// Compares the spectral denoiser, as "Noise Reduction" and "Voice Isolation"
// run it by default, with two open noise reducers used as yardsticks:
// speexdsp's preprocessor (linked) and ffmpeg's afftdn filter (run as a
// program). Speech spoken by espeak-ng is mixed with white, pink,
// babble-like and hum-like noise at 0, 5 and 10 dB SNR; every reducer runs on
// the same files. Printed per case: the improvement of SNR, segmental SNR and
// SI-SDR, and the speech distortion: the SI-SDR of the clean speech passed
// through the reducer's own time-frequency gains (for every reducer alike
// estimated as |output| / |input| per STFT bin, at most 1). Last, the
// musical noise: isolated spectral peaks per second left in white noise
// alone (3 s at -30 dBFS, the first second left out).
//
// Arguments, when given, keep only the reducers whose names contain one of
// them (`ZenNoiseComparison "Noise Reduction"`).
//
// Not a test: bench/noise-comparison.sh builds and runs it when
// libspeexdsp-dev and ffmpeg are installed.
#include <speex/speex_preprocess.h>

#include <algorithm>
#include <cmath>
#include <complex>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <string>
#include <vector>

#include "Common/NoiseReduction/zn_denoiser.h"
#include "FFT/FFT.h"
#include "Support/Signals.h"
#include "Support/SpeechQuality.h"
#include "Support/SpokenSpeech.h"

namespace {

namespace nr = zen::noise_reduction;
using Signal = std::vector<float>;

constexpr double kRate = 48000.0;
constexpr double kLeadSeconds = 0.5;  // noise alone first: the region learnt
constexpr std::size_t kStft = 1024, kHop = 256;

// --- Reducers -------------------------------------------------------------

Signal Denoise(const Signal& input, const nr::zn_denoise_settings& settings, bool learn) {
    nr::zn_denoiser d;
    d.SetChannelCount(1);
    d.Prepare(static_cast<float>(kRate), 512);
    if (learn) {
        nr::zn_denoise_settings s = settings;
        s.learning = true;
        d.Configure(s);
        Signal region(input.begin(), input.begin() + static_cast<std::ptrdiff_t>(kLeadSeconds * kRate));
        float* ch[] = {region.data()};
        d.Process(ch, region.size());
        d.Reset();
    }
    d.Configure(settings);
    Signal x(input);
    x.resize(input.size() + d.Latency(), 0.0f);
    for (std::size_t done = 0; done < x.size(); done += 512) {
        float* ch[] = {x.data() + done};
        d.Process(ch, std::min<std::size_t>(512, x.size() - done));
    }
    return Signal(x.begin() + d.Latency(), x.end());
}

Signal Speex(const Signal& input, int suppressDb) {
    const int frame = static_cast<int>(kRate / 50);  // 20 ms
    SpeexPreprocessState* st = speex_preprocess_state_init(frame, static_cast<int>(kRate));
    int on = 1, off = 0;
    speex_preprocess_ctl(st, SPEEX_PREPROCESS_SET_DENOISE, &on);
    speex_preprocess_ctl(st, SPEEX_PREPROCESS_SET_AGC, &off);
    speex_preprocess_ctl(st, SPEEX_PREPROCESS_SET_VAD, &off);
    speex_preprocess_ctl(st, SPEEX_PREPROCESS_SET_DEREVERB, &off);
    speex_preprocess_ctl(st, SPEEX_PREPROCESS_SET_NOISE_SUPPRESS, &suppressDb);
    Signal out(input.size(), 0.0f);
    std::vector<spx_int16_t> pcm(static_cast<std::size_t>(frame));
    for (std::size_t start = 0; start + static_cast<std::size_t>(frame) <= input.size(); start += frame) {
        for (int i = 0; i < frame; ++i)
            pcm[i] = static_cast<spx_int16_t>(std::lround(std::clamp(input[start + i], -1.0f, 1.0f) * 32767.0f));
        speex_preprocess_run(st, pcm.data());
        for (int i = 0; i < frame; ++i) out[start + i] = pcm[i] / 32767.0f;
    }
    speex_preprocess_state_destroy(st);
    return out;
}

Signal Afftdn(const Signal& input, const std::string& options) {
    const std::string in = "/tmp/zen-noise-comparison-in.f32", out = "/tmp/zen-noise-comparison-out.f32";
    FILE* f = std::fopen(in.c_str(), "wb");
    std::fwrite(input.data(), sizeof(float), input.size(), f);
    std::fclose(f);
    const std::string command = "ffmpeg -loglevel error -y -f f32le -ar 48000 -ac 1 -i " + in + " -af afftdn" +
                                (options.empty() ? "" : "=" + options) + " -f f32le " + out;
    if (std::system(command.c_str()) != 0) return {};
    Signal result(input.size(), 0.0f);
    f = std::fopen(out.c_str(), "rb");
    const std::size_t got = f != nullptr ? std::fread(result.data(), sizeof(float), result.size(), f) : 0;
    if (f != nullptr) std::fclose(f);
    result.resize(std::max(got, std::size_t{1}));
    result.resize(input.size(), 0.0f);
    return result;
}

// Shifts `x` so it lines up with `reference` (the lag of the largest
// cross-correlation within 100 ms).
Signal Align(const Signal& x, const Signal& reference) {
    const long range = static_cast<long>(0.1 * kRate);
    long best = 0;
    double bestValue = -1e300;
    for (long lag = -range; lag <= range; ++lag) {
        double sum = 0.0;
        for (std::size_t i = 0; i < reference.size(); i += 4) {
            const long j = static_cast<long>(i) + lag;
            if (j >= 0 && j < static_cast<long>(x.size())) sum += static_cast<double>(x[j]) * reference[i];
        }
        if (sum > bestValue) bestValue = sum, best = lag;
    }
    Signal y(reference.size(), 0.0f);
    for (std::size_t i = 0; i < y.size(); ++i) {
        const long j = static_cast<long>(i) + best;
        if (j >= 0 && j < static_cast<long>(x.size())) y[i] = x[j];
    }
    return y;
}

// --- The speech through a reducer's gains ---------------------------------

using Spectra = std::vector<std::vector<std::complex<float>>>;

Spectra Analyse(const Signal& x, ora::fft::FFT& fft, const std::vector<float>& window) {
    Spectra frames;
    std::vector<float> t(kStft);
    std::vector<ora::fft::Complex> f(kStft / 2 + 1);
    for (std::size_t start = 0; start + kStft <= x.size(); start += kHop) {
        for (std::size_t n = 0; n < kStft; ++n) t[n] = x[start + n] * window[n];
        fft.ForwardReal(t.data(), f.data());
        frames.emplace_back(f.begin(), f.end());
    }
    return frames;
}

Signal SpeechThroughGains(const Signal& clean, const Signal& noisy, const Signal& output) {
    ora::fft::FFT fft(kStft);
    std::vector<float> window(kStft);
    for (std::size_t n = 0; n < kStft; ++n) window[n] = static_cast<float>(std::sqrt(0.5 - 0.5 * std::cos(2 * M_PI * n / kStft)));
    const Spectra x = Analyse(noisy, fft, window), y = Analyse(output, fft, window), s = Analyse(clean, fft, window);
    Signal result(clean.size(), 0.0f);
    std::vector<ora::fft::Complex> f(kStft / 2 + 1);
    std::vector<float> t(kStft);
    for (std::size_t l = 0; l < s.size(); ++l) {
        for (std::size_t k = 0; k < f.size(); ++k) {
            const float gain = std::min(1.0f, std::abs(y[l][k]) / std::max(std::abs(x[l][k]), 1e-12f));
            f[k] = s[l][k] * gain;
        }
        fft.InverseReal(f.data(), t.data());
        // Root-Hann analysis and synthesis at a quarter hop sum to 2.
        for (std::size_t n = 0; n < kStft; ++n) result[l * kHop + n] += t[n] * window[n] / (kStft * 2.0f);
    }
    return result;
}

struct Reducer {
    const char* name;
    std::function<Signal(const Signal&)> run;
};

}  // namespace

int main(int argc, char** argv) {
    const Signal clean = zentest::SpeakPhrases(
        {"The quick brown fox jumps over the lazy dog.", "Noise reduction should keep the voice natural."}, kRate,
        kLeadSeconds);
    if (clean.empty()) {
        std::fprintf(stderr, "espeak-ng could not be run\n");
        return 1;
    }
    nr::zn_denoise_settings noiseReduction;  // "Noise Reduction" defaults: 20 dB, sensitivity 0 dB, smoothing 50 %
    noiseReduction.floor = 0.1f;
    nr::zn_denoise_settings learned = noiseReduction;
    learned.estimate = nr::zn_denoise_settings::Estimate::Learned;
    nr::zn_denoise_settings voice = noiseReduction;  // "Voice Isolation" defaults: background -30 dB, its own sensitivity
    voice.voiceGuided = true;
    voice.overSubtraction = 0.3f;
    voice.floor = std::pow(10.0f, -30.0f / 20.0f);
    voice.speechFloor = std::pow(10.0f, -10.0f / 20.0f);
    std::vector<Reducer> reducers = {
        {"Noise Reduction, adaptive", [&](const Signal& x) { return Denoise(x, noiseReduction, false); }},
        {"Noise Reduction, learnt", [&](const Signal& x) { return Denoise(x, learned, true); }},
        {"Voice Isolation", [&](const Signal& x) { return Denoise(x, voice, false); }},
        {"speexdsp (-15 dB, default)", [](const Signal& x) { return Speex(x, -15); }},
        {"speexdsp (-20 dB)", [](const Signal& x) { return Speex(x, -20); }},
        {"afftdn (default)", [](const Signal& x) { return Afftdn(x, ""); }},
        // Its noise floor told (from the lead-in, which is noise alone), 20 dB, tracking.
        {"afftdn (nf=measured, nr=20, tn=1)",
         [](const Signal& x) {
             const double rms = zentest::Rms(x, 0, static_cast<std::size_t>(kLeadSeconds * kRate));
             const double nf = std::clamp(20.0 * std::log10(rms + 1e-12), -80.0, -20.0);
             return Afftdn(x, "nr=20:tn=1:nf=" + std::to_string(nf));
         }},
    };
    if (argc > 1)
        reducers.erase(std::remove_if(reducers.begin(), reducers.end(),
                                      [&](const Reducer& r) {
                                          return std::none_of(argv + 1, argv + argc, [&](const char* a) {
                                              return std::string(r.name).find(a) != std::string::npos;
                                          });
                                      }),
                       reducers.end());
    std::printf("| noise | SNR in | reducer | dSNR | dSegSNR | dSI-SDR | speech SI-SDR |\n|---|---|---|---|---|---|---|\n");
    std::vector<double> meanSi(reducers.size(), 0.0), meanSpeech(reducers.size(), 0.0);
    int cases = 0;
    for (zentest::NoiseKind kind : {zentest::NoiseKind::White, zentest::NoiseKind::Pink, zentest::NoiseKind::Babble,
                                    zentest::NoiseKind::Hum}) {
        const Signal noise = zentest::MakeNoise(kind, clean.size(), kRate);
        for (double snr : {0.0, 5.0, 10.0}) {
            const Signal noisy = zentest::MixAtSnr(clean, noise, snr);
            const double inSnr = zentest::SnrDb(noisy, clean), inSeg = zentest::SegmentalSnrDb(noisy, clean, kRate),
                         inSi = zentest::SiSdrDb(noisy, clean);
            ++cases;
            for (std::size_t r = 0; r < reducers.size(); ++r) {
                const Signal out = Align(reducers[r].run(noisy), clean);
                const Signal speech = SpeechThroughGains(clean, noisy, out);
                const double si = zentest::SiSdrDb(out, clean) - inSi, speechSi = zentest::SiSdrDb(speech, clean);
                meanSi[r] += si;
                meanSpeech[r] += speechSi;
                std::printf("| %s | %.0f dB | %s | %.2f | %.2f | %.2f | %.2f |\n", zentest::NoiseName(kind), snr,
                            reducers[r].name, zentest::SnrDb(out, clean) - inSnr,
                            zentest::SegmentalSnrDb(out, clean, kRate) - inSeg, si, speechSi);
            }
        }
    }
    std::printf("\n| reducer | mean dSI-SDR | mean speech SI-SDR |\n|---|---|---|\n");
    for (std::size_t r = 0; r < reducers.size(); ++r)
        std::printf("| %s | %.2f | %.2f |\n", reducers[r].name, meanSi[r] / cases, meanSpeech[r] / cases);

    Signal white = zentest::MakeNoise(zentest::NoiseKind::White, static_cast<std::size_t>(3 * kRate), kRate);
    for (float& v : white) v *= 0.03f;
    const auto settled = [](const Signal& x) {
        return zentest::IsolatedPeaksPerSecond(Signal(x.begin() + static_cast<std::ptrdiff_t>(kRate), x.end()), kRate);
    };
    std::printf("\n| white noise alone through | isolated peaks/s |\n|---|---|\n| (nothing) | %.0f |\n", settled(white));
    for (const Reducer& r : reducers) std::printf("| %s | %.0f |\n", r.name, settled(r.run(white)));
    return 0;
}
