#include "Support/SpeechQuality.h"

#include <algorithm>
#include <cmath>
#include <complex>

#include "Support/Signals.h"

namespace zentest {

namespace {

constexpr double kTiny = 1e-30;

// In-place radix-2 FFT: the measure must not depend on the FFT under test.
void Fft(std::vector<std::complex<double>>& a) {
    const std::size_t n = a.size();
    for (std::size_t i = 1, j = 0; i < n; ++i) {
        std::size_t bit = n >> 1;
        for (; j & bit; bit >>= 1) j ^= bit;
        j ^= bit;
        if (i < j) std::swap(a[i], a[j]);
    }
    for (std::size_t len = 2; len <= n; len <<= 1) {
        const double angle = -2 * kPi / static_cast<double>(len);
        const std::complex<double> wl(std::cos(angle), std::sin(angle));
        for (std::size_t i = 0; i < n; i += len) {
            std::complex<double> w(1.0);
            for (std::size_t j = 0; j < len / 2; ++j) {
                const std::complex<double> u = a[i + j], v = a[i + j + len / 2] * w;
                a[i + j] = u + v;
                a[i + j + len / 2] = u - v;
                w *= wl;
            }
        }
    }
}

}  // namespace

double SnrDb(const std::vector<float>& estimate, const std::vector<float>& reference) {
    double signal = 0.0, error = 0.0;
    for (std::size_t i = 0; i < std::min(estimate.size(), reference.size()); ++i) {
        signal += static_cast<double>(reference[i]) * reference[i];
        const double e = static_cast<double>(estimate[i]) - reference[i];
        error += e * e;
    }
    return 10.0 * std::log10((signal + kTiny) / (error + kTiny));
}

double SegmentalSnrDb(const std::vector<float>& estimate, const std::vector<float>& reference, double sampleRate) {
    const auto frame = static_cast<std::size_t>(0.02 * sampleRate);
    const std::size_t n = std::min(estimate.size(), reference.size());
    std::vector<double> signal, error;
    for (std::size_t i = 0; i + frame <= n; i += frame) {
        double s = 0.0, e = 0.0;
        for (std::size_t j = i; j < i + frame; ++j) {
            s += static_cast<double>(reference[j]) * reference[j];
            const double d = static_cast<double>(estimate[j]) - reference[j];
            e += d * d;
        }
        signal.push_back(s);
        error.push_back(e);
    }
    const double loudest = signal.empty() ? 0.0 : *std::max_element(signal.begin(), signal.end());
    double sum = 0.0;
    std::size_t count = 0;
    for (std::size_t f = 0; f < signal.size(); ++f) {
        if (signal[f] <= loudest * 1e-4) continue;
        sum += std::clamp(10.0 * std::log10((signal[f] + kTiny) / (error[f] + kTiny)), -10.0, 35.0);
        ++count;
    }
    return count > 0 ? sum / static_cast<double>(count) : 0.0;
}

double SiSdrDb(const std::vector<float>& estimate, const std::vector<float>& reference) {
    const std::size_t n = std::min(estimate.size(), reference.size());
    double dot = 0.0, energy = 0.0;
    for (std::size_t i = 0; i < n; ++i) {
        dot += static_cast<double>(estimate[i]) * reference[i];
        energy += static_cast<double>(reference[i]) * reference[i];
    }
    const double alpha = dot / (energy + kTiny);
    double target = 0.0, rest = 0.0;
    for (std::size_t i = 0; i < n; ++i) {
        const double t = alpha * reference[i];
        const double r = estimate[i] - t;
        target += t * t;
        rest += r * r;
    }
    return 10.0 * std::log10((target + kTiny) / (rest + kTiny));
}

double IsolatedPeaksPerSecond(const std::vector<float>& x, double sampleRate) {
    std::size_t length = 1024;
    while (static_cast<double>(length) > 1024.0 * sampleRate / 48000.0 * 1.5 && length > 64) length /= 2;
    // Frames that do not overlap: neighbours in time are independent.
    const std::size_t hop = length, bins = length / 2 + 1;
    std::vector<std::vector<double>> db;
    std::vector<std::complex<double>> a(length);
    double loudest = -400.0;
    for (std::size_t start = 0; start + length <= x.size(); start += hop) {
        for (std::size_t n = 0; n < length; ++n)
            a[n] = x[start + n] * (0.5 - 0.5 * std::cos(2 * kPi * static_cast<double>(n) / static_cast<double>(length)));
        Fft(a);
        std::vector<double> row(bins);
        for (std::size_t k = 0; k < bins; ++k) {
            row[k] = 10.0 * std::log10(std::norm(a[k]) + kTiny);
            loudest = std::max(loudest, row[k]);
        }
        db.push_back(std::move(row));
    }
    std::size_t peaks = 0;
    for (std::size_t l = 1; l + 1 < db.size(); ++l) {
        for (std::size_t k = 1; k + 1 < bins; ++k) {
            const double v = db[l][k];
            if (v < loudest - 60.0) continue;
            double around[8];
            int n = 0;
            bool largest = true;
            for (int dl = -1; dl <= 1; ++dl)
                for (int dk = -1; dk <= 1; ++dk) {
                    if (dl == 0 && dk == 0) continue;
                    around[n] = db[l + dl][k + dk];
                    largest &= v >= around[n];
                    ++n;
                }
            std::nth_element(around, around + 4, around + 8);
            peaks += largest && v - 0.5 * (*std::max_element(around, around + 4) + around[4]) >= kIsolatedPeakDb;
        }
    }
    return static_cast<double>(peaks) / (static_cast<double>(x.size()) / sampleRate);
}

}  // namespace zentest
