#include "PeriodicPinkNoise.h"

#include <algorithm>
#include <cmath>
#include <random>

#include "FFT/FFT.h"

PeriodicPinkNoise::PeriodicPinkNoise() = default;

bool PeriodicPinkNoise::Prepare(float sampleRate, std::uint32_t maxBlock) {
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    std::size_t period = 2;
    while (period < kMinPeriodSeconds * sampleRate) period *= 2;
    ora::fft::FFT fft(period);
    std::vector<ora::fft::Complex> bins(fft.Bins());
    std::mt19937 random(kSeed);
    const double binHz = static_cast<double>(sampleRate) / static_cast<double>(period);
    for (std::size_t k = 1; k + 1 < bins.size(); ++k) {
        const double f = static_cast<double>(k) * binHz;
        if (f < kLowHz || f > kHighHz) continue;
        const double phase = 2.0 * 3.141592653589793 * static_cast<double>(random()) / 4294967296.0;
        const double magnitude = 1.0 / std::sqrt(f);
        bins[k] = ora::fft::Complex(static_cast<float>(magnitude * std::cos(phase)),
                                    static_cast<float>(magnitude * std::sin(phase)));
    }
    m_loop.assign(period, 0.0f);
    fft.InverseReal(bins.data(), m_loop.data());
    double power = 0.0;
    for (float x : m_loop) power += double{x} * x;
    const double scale = 1.0 / std::sqrt(power / static_cast<double>(period));
    for (float& x : m_loop) x = static_cast<float>(x * scale);
    Reset();
    return true;
}

void PeriodicPinkNoise::Reset() { m_position = 0; }

void PeriodicPinkNoise::Read(std::uint64_t channel, float* out, std::uint64_t count) const noexcept {
    const std::size_t period = m_loop.size();
    if (period == 0) {
        std::fill_n(out, count, 0.0f);
        return;
    }
    std::size_t at = (m_position + (channel % kOffsets) * (period / kOffsets)) % period;
    std::uint64_t done = 0;
    while (done < count) {
        const std::size_t n = std::min<std::uint64_t>(count - done, period - at);
        std::copy_n(m_loop.data() + at, n, out + done);
        done += n;
        at = 0;
    }
}

bool PeriodicPinkNoise::Process(float* const* channels, std::uint64_t count) {
    for (std::uint64_t c = 0; c < GetChannelCount(); ++c) Read(c, channels[c], count);
    if (!m_loop.empty()) Advance(count);
    return true;
}
