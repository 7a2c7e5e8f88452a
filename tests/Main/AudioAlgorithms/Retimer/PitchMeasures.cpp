#include "PitchMeasures.h"

#include <algorithm>
#include <cmath>
#include <complex>
#include <random>

#include "FFT/FFT.h"
#include "FFT/Window.h"
#include "Retimer/CubicInterpolator.h"

namespace zentest {

namespace {

constexpr double kTwoPi = 6.283185307179586;

double Princarg(double p) { return p - kTwoPi * std::floor((p + M_PI) / kTwoPi); }

std::vector<double> MagnitudeSpectrum(const std::vector<float>& x, std::size_t from, std::size_t length,
                                      std::size_t padded) {
    std::vector<float> frame(padded, 0.0f);
    for (std::size_t i = 0; i < length && from + i < x.size(); ++i) {
        const double t = kTwoPi * static_cast<double>(i) / static_cast<double>(length);
        const double w = 0.35875 - 0.48829 * std::cos(t) + 0.14128 * std::cos(2 * t) - 0.01168 * std::cos(3 * t);
        frame[i] = static_cast<float>(w * x[from + i]);
    }
    ora::fft::FFT fft(padded, ora::fft::Backend::Kiss);
    std::vector<ora::fft::Complex> bins(padded / 2 + 1);
    fft.ForwardReal(frame.data(), bins.data());
    std::vector<double> mag(bins.size());
    for (std::size_t k = 0; k < bins.size(); ++k) mag[k] = std::abs(bins[k]);
    return mag;
}

}  // namespace

double PartialFrequency(const std::vector<float>& x, std::size_t from, std::size_t length, double expected,
                        double cents) {
    const std::size_t padded = 4 * length;
    const std::vector<double> mag = MagnitudeSpectrum(x, from, length, padded);
    const double binHz = kRate / static_cast<double>(padded);
    const double lo = expected * std::pow(2.0, -cents / 1200.0) / binHz;
    const double hi = expected * std::pow(2.0, cents / 1200.0) / binHz;
    std::size_t best = static_cast<std::size_t>(std::max(1.0, std::floor(lo)));
    for (std::size_t k = best; k <= static_cast<std::size_t>(std::ceil(hi)) && k + 1 < mag.size(); ++k)
        if (mag[k] > mag[best]) best = k;
    const double a = std::log(mag[best - 1] + 1e-30);
    const double b = std::log(mag[best] + 1e-30);
    const double c = std::log(mag[best + 1] + 1e-30);
    const double offset = 0.5 * (a - c) / (a - 2 * b + c);
    return (static_cast<double>(best) + offset) * binHz;
}

double Cents(double measured, double expected) { return 1200.0 * std::log2(measured / expected); }

std::vector<std::vector<float>> Stream(const std::vector<std::vector<float>>& channels, const ShifterSettings& s,
                                       std::size_t block) {
    ora::pitchshift::EngineParam param(4096, 4, 4096, 2);
    ora::pitchshift::Engine engine(param);
    const std::size_t count = channels.size();
    if (!engine.Configure(count)) return {};
    engine.SetJoint(s.joint);
    ora::pitchshift::Engine::Settings wanted;
    wanted.coarse = s.coarse;
    wanted.fine = s.fine;
    wanted.dryWet = s.dryWet;
    wanted.algorithmType = s.algorithm;
    wanted.algorithmMode = s.mode;
    engine.Apply(wanted, engine.Changes(wanted));
    engine.Reset();  // the mix starts at its setting rather than ramping to it

    const std::size_t length = channels[0].size();
    std::vector<std::vector<float>> out(count, std::vector<float>(length, 0.0f));
    std::vector<const float*> ip(count);
    std::vector<float*> op(count);
    for (std::size_t done = 0; done < length;) {
        const std::size_t n = std::min(block, length - done);
        for (std::size_t c = 0; c < count; ++c) {
            ip[c] = channels[c].data() + done;
            op[c] = out[c].data() + done;
        }
        engine.Process(ip.data(), op.data(), n);
        done += n;
    }
    return out;
}

std::vector<float> Stream(const std::vector<float>& x, const ShifterSettings& s, std::size_t block) {
    return Stream(std::vector<std::vector<float>>{x}, s, block)[0];
}

std::size_t ShifterLatency() {
    ora::pitchshift::EngineParam param(4096, 4, 4096, 2);
    ora::pitchshift::Engine engine(param);
    return engine.Configure(1) ? engine.Latency() : 0;
}

std::vector<std::vector<float>> Shift(const std::vector<std::vector<float>>& channels, const ShifterSettings& s,
                                      std::size_t block) {
    const std::size_t latency = ShifterLatency();
    std::vector<std::vector<float>> in = channels;
    for (auto& c : in) c.resize(c.size() + latency, 0.0f);
    std::vector<std::vector<float>> out = Stream(in, s, block);
    for (auto& o : out) o.erase(o.begin(), o.begin() + static_cast<std::ptrdiff_t>(latency));
    return out;
}

std::vector<float> Shift(const std::vector<float>& x, const ShifterSettings& s, std::size_t block) {
    return Shift(std::vector<std::vector<float>>{x}, s, block)[0];
}

std::vector<float> PlainVocoderShift(const std::vector<float>& x, double ratio) {
    const std::size_t n = 4096, hop = 1024, bins = n / 2 + 1;
    std::vector<float> win(n), dual(n);
    ora::fft::Window::MakePair(win.data(), dual.data(), n, hop);
    ora::fft::FFT fft(n, ora::fft::Backend::Kiss);
    const std::size_t outLength = static_cast<std::size_t>(std::ceil(static_cast<double>(x.size()) * ratio)) + 2 * n;
    std::vector<double> stretched(outLength + n, 0.0);
    std::vector<float> frame(n);
    std::vector<ora::fft::Complex> spec(bins);
    std::vector<double> prevPhase(bins, 0.0), synthPhase(bins, 0.0);
    std::int64_t prevStart = 0;
    const double half = static_cast<double>(n) / 2.0;
    auto sample = [&](std::int64_t i) { return i >= 0 && i < static_cast<std::int64_t>(x.size()) ? x[i] : 0.0f; };
    for (std::size_t k = 0; k * hop < outLength; ++k) {
        // Synthesis centre k hop + n/2 in stretched time is input time (that) / ratio.
        const auto start = static_cast<std::int64_t>(std::llround((static_cast<double>(k * hop) + half) / ratio - half));
        for (std::size_t j = 0; j < n; ++j) frame[(j + n / 2) % n] = sample(start + static_cast<std::int64_t>(j)) * win[j];
        fft.ForwardReal(frame.data(), spec.data());
        const double ha = k == 0 ? static_cast<double>(hop) / ratio : static_cast<double>(std::max<std::int64_t>(1, start - prevStart));
        for (std::size_t b = 0; b < bins; ++b) {
            const double phase = std::arg(spec[b]);
            const double omega = kTwoPi * static_cast<double>(b) / static_cast<double>(n);
            if (k == 0) {
                synthPhase[b] = phase;
            } else {
                const double inst = omega + Princarg(phase - prevPhase[b] - omega * ha) / ha;
                synthPhase[b] = Princarg(synthPhase[b] + static_cast<double>(hop) * inst);
            }
            prevPhase[b] = phase;
            spec[b] = std::polar(std::abs(spec[b]), static_cast<float>(synthPhase[b]));
        }
        prevStart = start;
        fft.InverseReal(spec.data(), frame.data());
        for (std::size_t j = 0; j < n; ++j)
            stretched[k * hop + j] += frame[(j + n / 2) % n] / static_cast<double>(n) * dual[j];
    }
    // Stretched time ratio * i shows input time i.
    std::vector<float> y(x.size());
    auto s = [&](std::int64_t i) {
        return i >= 0 && i < static_cast<std::int64_t>(stretched.size()) ? static_cast<float>(stretched[i]) : 0.0f;
    };
    for (std::size_t i = 0; i < y.size(); ++i) {
        const double t = ratio * static_cast<double>(i);
        const auto b = static_cast<std::int64_t>(std::floor(t));
        y[i] = ora::retimer::interp::cubic::Interpolate(s(b - 1), s(b), s(b + 1), s(b + 2),
                                                          static_cast<float>(t - static_cast<double>(b)));
    }
    return y;
}

Quality Compare(const std::vector<float>& reference, const std::vector<float>& test, std::size_t skip) {
    const std::size_t n = 2048, hop = 512, bins = n / 2 + 1;
    ora::fft::FFT fft(n, ora::fft::Backend::Kiss);
    std::vector<float> win(n);
    ora::fft::Window::Hann(win.data(), n);
    std::vector<float> fr(n), ft(n);
    std::vector<ora::fft::Complex> sr(bins), st(bins);
    std::vector<double> magR, magT;
    const std::size_t end = std::min(reference.size(), test.size()) - skip;
    for (std::size_t start = skip; start + n <= end; start += hop) {
        for (std::size_t j = 0; j < n; ++j) {
            fr[j] = reference[start + j] * win[j];
            ft[j] = test[start + j] * win[j];
        }
        fft.ForwardReal(fr.data(), sr.data());
        fft.ForwardReal(ft.data(), st.data());
        for (std::size_t k = 0; k < bins; ++k) {
            magR.push_back(std::abs(sr[k]));
            magT.push_back(std::abs(st[k]));
        }
    }
    // Powers are floored 60 dB below the reference's loudest bin, so the
    // window's side lobes and the numeric floor do not dominate the distance.
    double peak = 0.0;
    for (double m : magR) peak = std::max(peak, m * m);
    const double floor = 1e-6 * peak;
    double diff = 0.0, energy = 0.0, lsd = 0.0;
    const std::size_t frames = magR.size() / bins;
    for (std::size_t f = 0; f < frames; ++f) {
        double frameLsd = 0.0;
        for (std::size_t k = 0; k < bins; ++k) {
            const double a = magR[f * bins + k], b = magT[f * bins + k];
            diff += (a - b) * (a - b);
            energy += a * a;
            const double d = 10.0 * std::log10((a * a + floor) / (b * b + floor));
            frameLsd += d * d;
        }
        lsd += std::sqrt(frameLsd / static_cast<double>(bins));
    }
    return {10.0 * std::log10(diff / energy), lsd / static_cast<double>(std::max<std::size_t>(frames, 1))};
}

std::vector<float> HarmonicTone(double f0, int harmonics, std::size_t frames, double amplitude) {
    std::vector<float> x(frames, 0.0f);
    for (int h = 1; h <= harmonics; ++h) {
        const double f = f0 * h;
        if (f >= kRate / 2) break;
        const double a = amplitude / h;
        for (std::size_t i = 0; i < frames; ++i)
            x[i] += static_cast<float>(a * std::sin(kTwoPi * f * static_cast<double>(i) / kRate + 0.7 * h));
    }
    return x;
}

std::vector<float> Chord(const std::vector<double>& frequencies, std::size_t frames, double amplitude) {
    std::vector<float> x(frames, 0.0f);
    for (double f : frequencies)
        for (std::size_t i = 0; i < frames; ++i)
            x[i] += static_cast<float>(amplitude * std::sin(kTwoPi * f * static_cast<double>(i) / kRate));
    return x;
}

std::vector<float> Chirp(double f0, double f1, std::size_t frames, double amplitude) {
    std::vector<float> x(frames);
    const double duration = static_cast<double>(frames) / kRate;
    const double k = std::log(f1 / f0) / duration;
    for (std::size_t i = 0; i < frames; ++i) {
        const double t = static_cast<double>(i) / kRate;
        x[i] = static_cast<float>(amplitude * std::sin(kTwoPi * f0 * (std::exp(k * t) - 1.0) / k));
    }
    return x;
}

std::vector<float> SpeechLike(std::size_t frames) {
    // A glottal pulse train with a gliding pitch through two formant
    // resonators, in syllables of about 200 ms.
    std::vector<float> x(frames, 0.0f);
    double phase = 0.0;
    double y1[2] = {0, 0}, y2[2] = {0, 0};
    const double formants[2] = {700.0, 1200.0};
    for (std::size_t i = 0; i < frames; ++i) {
        const double t = static_cast<double>(i) / kRate;
        const double f0 = 120.0 + 30.0 * std::sin(kTwoPi * 1.3 * t);
        phase += f0 / kRate;
        double excitation = 0.0;
        if (phase >= 1.0) {
            phase -= 1.0;
            excitation = 1.0;
        }
        double out = 0.0;
        for (int f = 0; f < 2; ++f) {
            const double r = 0.97;
            const double w = kTwoPi * formants[f] * (1.0 + 0.2 * std::sin(kTwoPi * 2.0 * t + f)) / kRate;
            const double y = excitation + 2.0 * r * std::cos(w) * y1[f] - r * r * y2[f];
            y2[f] = y1[f];
            y1[f] = y;
            out += y;
        }
        const double syllable = std::pow(std::sin(M_PI * std::fmod(t / 0.2, 1.0)), 2.0);
        x[i] = static_cast<float>(0.02 * out * syllable);
    }
    return x;
}

std::vector<float> Transients(std::size_t frames) {
    // Decaying noise bursts with a pitched body, four a second.
    std::vector<float> x(frames, 0.0f);
    std::mt19937 rng(3);
    std::uniform_real_distribution<double> u(-1.0, 1.0);
    const std::size_t period = static_cast<std::size_t>(kRate / 4);
    for (std::size_t i = 0; i < frames; ++i) {
        const double t = static_cast<double>(i % period) / kRate;
        const double env = std::exp(-t / 0.03);
        x[i] = static_cast<float>(0.5 * env * (0.6 * u(rng) + 0.4 * std::sin(kTwoPi * 180.0 * t)));
    }
    return x;
}

std::vector<float> Clicks(std::size_t frames, std::uint32_t seed) {
    std::vector<float> x(frames, 0.0f);
    std::mt19937 rng(seed);
    for (std::size_t at = 3000; at + 2000 < frames; at += 5000 + rng() % 1000) x[at] = 0.8f;
    return x;
}

}  // namespace zentest
