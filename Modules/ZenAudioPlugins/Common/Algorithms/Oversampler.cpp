#include "Oversampler.h"

#include <cmath>
#include <limits>
#include <stdexcept>

#include "Algorithms/KaiserLowPass.h"

namespace {

// The sharp stages run at twice the base rate.
constexpr std::size_t kSharpFactor = 2;

// Kaiser's estimates: the window's shape for a stop band of A dB, and the
// length for a transition band of df cycles per sample. They fall short by
// a dB or two at the band edge, so the filters aim this much lower.
constexpr double kDesignMarginDb = 2.0;
double KaiserBeta(double attenuationDb) { return 0.1102 * (attenuationDb + kDesignMarginDb - 8.7); }
double KaiserLength(double attenuationDb, double df) {
    return (attenuationDb + kDesignMarginDb - 7.95) / (14.36 * df);
}

// One filter: its band edges in the base rate's units and the multiple of
// the base rate it runs at.
struct Band {
    double pass, stop;
    std::size_t rate;
};

std::size_t MinimumLength(const Band& band) {
    const double df = (band.stop - band.pass) / static_cast<double>(band.rate);
    return static_cast<std::size_t>(std::ceil(KaiserLength(Oversampler::kStopbandDb, df)));
}

std::vector<float> Prototype(const Band& band, std::size_t length) {
    const double cutoff = 0.5 * (band.pass + band.stop) / static_cast<double>(band.rate);
    return ora::numeric::KaiserLowPass(length, cutoff, KaiserBeta(Oversampler::kStopbandDb));
}

std::size_t CeilDiv(std::size_t a, std::size_t b) { return (a + b - 1) / b; }

// The interpolators stop where the images of the pass band begin, at the
// sharp stage's rate and at the full rate; the decimators where what they
// let through would fold onto the base band.
Band SharpUpBand() { return {Oversampler::kPassbandEdge, Oversampler::kImageStopbandEdge, kSharpFactor}; }
Band WideUpBand(std::size_t factor) {
    return {Oversampler::kPassbandEdge, kSharpFactor - Oversampler::kImageStopbandEdge, factor};
}
Band WideDownBand(std::size_t factor) {
    return {Oversampler::kPassbandEdge, kSharpFactor - Oversampler::kStopbandEdge, factor};
}
Band SharpDownBand() { return {Oversampler::kPassbandEdge, Oversampler::kStopbandEdge, kSharpFactor}; }

}  // namespace

Oversampler::Oversampler(std::size_t factor, std::size_t stageHalfSamples)
    : m_factor(factor),
      m_wideFactor(factor / kSharpFactor),
      m_stageHalfSamples(stageHalfSamples),
      m_lengths((factor == 2 || factor == 4 || factor == 8) && stageHalfSamples <= 2 ? Design(factor, stageHalfSamples)
                                                                                     : Lengths{}) {
    if (factor != 2 && factor != 4 && factor != 8) throw std::invalid_argument("Oversampler: factor 2, 4 or 8");
    if (stageHalfSamples > 2) throw std::invalid_argument("Oversampler: a stage delay of 0, 1 or 2 half samples");
}

Oversampler::~Oversampler() = default;

std::size_t Oversampler::DelayHalfSamples(std::size_t factor, std::size_t stageHalfSamples, const Lengths& n) {
    // Each filter delays by (length - 1) / 2 of its own rate's samples, and
    // each decimator by (its factor - 1) input samples less, for keeping the
    // last sample of each group; in half samples of the full rate.
    const std::size_t wide = factor / kSharpFactor;
    return wide * (n.sharpUp - 1) + (n.wideUp - 1) + stageHalfSamples + (n.wideDown - 1) + wide * (n.sharpDown - 1) -
           2 * (wide - 1) - 2 * wide;
}

Oversampler::Lengths Oversampler::Design(std::size_t factor, std::size_t stageHalfSamples) {
    const std::size_t wide = factor / kSharpFactor;
    const std::size_t a0 = MinimumLength(SharpUpBand()), d0 = MinimumLength(SharpDownBand());
    const std::size_t b0 = wide > 1 ? MinimumLength(WideUpBand(factor)) : 1;
    const std::size_t c0 = wide > 1 ? MinimumLength(WideDownBand(factor)) : 1;
    const std::size_t spread = wide > 1 ? 2 * factor : 1;
    // Multiply-adds per base-rate sample of each length, its polyphase
    // padding included: the cheapest set whose delay is on whole samples.
    Lengths best;
    std::size_t bestCost = std::numeric_limits<std::size_t>::max();
    for (std::size_t a = a0; a < a0 + 2 * kSharpFactor; ++a)
        for (std::size_t b = b0; b < b0 + spread; ++b)
            for (std::size_t c = c0; c < c0 + spread; ++c)
                for (std::size_t d = d0; d < d0 + 2 * kSharpFactor; ++d) {
                    const Lengths n{a, b, c, d};
                    if (DelayHalfSamples(factor, stageHalfSamples, n) % (2 * factor) != 0) continue;
                    const std::size_t cost = kSharpFactor * CeilDiv(a, kSharpFactor) + factor * CeilDiv(b, wide) +
                                             factor * CeilDiv(c, wide) + kSharpFactor * CeilDiv(d, kSharpFactor);
                    if (cost < bestCost) {
                        bestCost = cost;
                        best = n;
                    }
                }
    return best;
}

std::uint32_t Oversampler::GetLatency() const {
    return static_cast<std::uint32_t>(DelayHalfSamples(m_factor, m_stageHalfSamples, m_lengths) / (2 * m_factor));
}

bool Oversampler::Prepare(float sampleRate, std::uint32_t maxBlock) {
    using namespace ora::numeric;
    const std::size_t block = maxBlock > 0 ? maxBlock : 1;
    const std::vector<float> sharpUp = Prototype(SharpUpBand(), m_lengths.sharpUp);
    const std::vector<float> sharpDown = Prototype(SharpDownBand(), m_lengths.sharpDown);
    const bool wide = m_wideFactor > 1;
    const std::vector<float> wideUp = wide ? Prototype(WideUpBand(m_factor), m_lengths.wideUp) : std::vector<float>{};
    const std::vector<float> wideDown =
        wide ? Prototype(WideDownBand(m_factor), m_lengths.wideDown) : std::vector<float>{};
    const std::size_t middle = block * kSharpFactor;
    for (Channel& channel : m_channels) {
        channel.sharpUp = std::make_unique<Upsampler>(
            UpsamplerConfig{kSharpFactor, CeilDiv(sharpUp.size(), kSharpFactor), sharpUp, 1, block});
        channel.sharpDown = std::make_unique<Downsampler>(
            DownsamplerConfig{kSharpFactor, CeilDiv(sharpDown.size(), kSharpFactor), sharpDown, 1, middle});
        if (wide) {
            channel.wideUp = std::make_unique<Upsampler>(
                UpsamplerConfig{m_wideFactor, CeilDiv(wideUp.size(), m_wideFactor), wideUp, 1, middle});
            channel.wideDown = std::make_unique<Downsampler>(
                DownsamplerConfig{m_wideFactor, CeilDiv(wideDown.size(), m_wideFactor), wideDown, 1, block * m_factor});
            channel.middle.Resize(middle);
        }
        channel.high.Resize(block * m_factor);
    }
    return ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
}

void Oversampler::SetChannelCount(std::uint64_t channels) {
    ZenAudioAlgorithm::SetChannelCount(channels);
    m_channels.resize(channels);
}

void Oversampler::Reset() {
    for (Channel& channel : m_channels) {
        if (channel.sharpUp) channel.sharpUp->Reset();
        if (channel.wideUp) channel.wideUp->Reset();
        if (channel.wideDown) channel.wideDown->Reset();
        if (channel.sharpDown) channel.sharpDown->Reset();
        channel.middle.Clear();
        channel.high.Clear();
    }
}

float* Oversampler::Up(std::uint64_t channel, const float* in, std::uint64_t frames) noexcept {
    Channel& ch = m_channels[channel];
    if (!ch.wideUp) {
        ch.sharpUp->Process(in, ch.high.data(), frames);
    } else {
        ch.sharpUp->Process(in, ch.middle.data(), frames);
        ch.wideUp->Process(ch.middle.data(), ch.high.data(), frames * kSharpFactor);
    }
    return ch.high.data();
}

void Oversampler::Down(std::uint64_t channel, float* out, std::uint64_t frames) noexcept {
    Channel& ch = m_channels[channel];
    if (!ch.wideDown) {
        ch.sharpDown->Process(ch.high.data(), out, frames * m_factor);
    } else {
        ch.wideDown->Process(ch.high.data(), ch.middle.data(), frames * m_factor);
        ch.sharpDown->Process(ch.middle.data(), out, frames * kSharpFactor);
    }
}

bool Oversampler::Process(float* const* channels, std::uint64_t count) {
    for (std::uint64_t c = 0; c < m_channels.size(); ++c) {
        if (!m_channels[c].sharpUp) return false;
        Up(c, channels[c], count);
        Down(c, channels[c], count);
    }
    return true;
}
