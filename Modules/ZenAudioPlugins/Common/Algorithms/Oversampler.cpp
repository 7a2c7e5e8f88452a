#include "Oversampler.h"

#include <cmath>
#include <complex>
#include <limits>
#include <map>
#include <mutex>
#include <stdexcept>
#include <utility>

#include "Algorithms/KaiserLowPass.h"

namespace {

// The sharp stages run at twice the base rate.
constexpr std::size_t kSharpFactor = 2;

// Kaiser's estimates: the window's shape for a stop band of A dB, and the
// length for a transition band of df cycles per sample. The window aims this
// much lower, so that a length that reaches the stop band exists; the length
// starts from the estimate and grows until the stop band, measured, is met
// (short filters, and some lengths of each parity, fall short of the estimate).
constexpr double kDesignMarginDb = 2.0;
double KaiserBeta(double attenuationDb) { return 0.1102 * (attenuationDb + kDesignMarginDb - 8.7); }
double KaiserLength(double attenuationDb, double df) { return (attenuationDb - 7.95) / (14.36 * df); }
// Points per 1/length cycles per sample (about one lobe of the stop band)
// where the stop band is measured.
constexpr double kPointsPerLobe = 16.0;

// One filter: its band edges in the base rate's units and the multiple of
// the base rate it runs at.
struct Band {
    double pass, stop;
    std::size_t rate;
    double stopDb;
};

std::size_t EstimatedLength(const Band& band) {
    const double df = (band.stop - band.pass) / static_cast<double>(band.rate);
    return static_cast<std::size_t>(std::ceil(KaiserLength(band.stopDb, df)));
}

std::vector<float> Prototype(const Band& band, std::size_t length) {
    const double cutoff = 0.5 * (band.pass + band.stop) / static_cast<double>(band.rate);
    return ora::numeric::KaiserLowPass(length, cutoff, KaiserBeta(band.stopDb));
}

// Whether the prototype of `length` (its float coefficients) keeps its whole
// stop band, from the band's edge to its own Nyquist frequency, as far down as it should.
bool MeetsStopband(const Band& band, std::size_t length) {
    constexpr double kTwoPi = 6.283185307179586;
    const std::vector<float> h = Prototype(band, length);
    const double limit = std::pow(10.0, -band.stopDb / 20.0);
    const double step = 1.0 / (kPointsPerLobe * static_cast<double>(length));
    for (double f = band.stop / static_cast<double>(band.rate); f <= 0.5; f += step) {
        const std::complex<double> turn = std::polar(1.0, -kTwoPi * f);
        std::complex<double> z = 1.0, sum = 0.0;
        for (float c : h) {
            sum += static_cast<double>(c) * z;
            z *= turn;
        }
        if (std::abs(sum) > limit) return false;
    }
    return true;
}

// Which lengths from `first` on, `count` of them, meet the stop band.
std::vector<bool> LengthsMeeting(const Band& band, std::size_t first, std::size_t count) {
    std::vector<bool> meets(count);
    for (std::size_t i = 0; i < count; ++i) meets[i] = MeetsStopband(band, first + i);
    return meets;
}

std::size_t CeilDiv(std::size_t a, std::size_t b) { return (a + b - 1) / b; }

// The interpolators stop where the images of the pass band begin, at the
// sharp stage's rate and at the full rate; the decimators where what they
// let through would fold onto the base band.
Band SharpUpBand() {
    return {Oversampler::kPassbandEdge, Oversampler::kImageStopbandEdge, kSharpFactor, Oversampler::kStopbandDb};
}
Band WideUpBand(std::size_t factor) {
    return {Oversampler::kPassbandEdge, kSharpFactor - Oversampler::kImageStopbandEdge, factor,
            Oversampler::kWideStopbandDb};
}
Band WideDownBand(std::size_t factor) {
    return {Oversampler::kPassbandEdge, kSharpFactor - Oversampler::kStopbandEdge, factor,
            Oversampler::kWideStopbandDb};
}
Band SharpDownBand() {
    return {Oversampler::kPassbandEdge, Oversampler::kStopbandEdge, kSharpFactor, Oversampler::kStopbandDb};
}

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
    // Measuring the candidates takes milliseconds: each design once per process.
    static std::mutex mutex;
    static std::map<std::pair<std::size_t, std::size_t>, Lengths> designs;
    const std::lock_guard<std::mutex> lock(mutex);
    const auto key = std::make_pair(factor, stageHalfSamples);
    const auto found = designs.find(key);
    if (found != designs.end()) return found->second;
    return designs[key] = Search(factor, stageHalfSamples);
}

Oversampler::Lengths Oversampler::Search(std::size_t factor, std::size_t stageHalfSamples) {
    const std::size_t wide = factor / kSharpFactor;
    // Enough lengths of each filter that every delay parity has some that meet.
    const std::size_t sharpSpread = 4 * kSharpFactor, wideSpread = wide > 1 ? 4 * factor : 1;
    const std::size_t a0 = EstimatedLength(SharpUpBand()), d0 = EstimatedLength(SharpDownBand());
    const std::size_t b0 = wide > 1 ? EstimatedLength(WideUpBand(factor)) : 1;
    const std::size_t c0 = wide > 1 ? EstimatedLength(WideDownBand(factor)) : 1;
    const std::vector<bool> aMeets = LengthsMeeting(SharpUpBand(), a0, sharpSpread);
    const std::vector<bool> dMeets = LengthsMeeting(SharpDownBand(), d0, sharpSpread);
    const std::vector<bool> bMeets = wide > 1 ? LengthsMeeting(WideUpBand(factor), b0, wideSpread) : std::vector<bool>{true};
    const std::vector<bool> cMeets =
        wide > 1 ? LengthsMeeting(WideDownBand(factor), c0, wideSpread) : std::vector<bool>{true};
    // Multiply-adds per base-rate sample of each length, its polyphase
    // padding included: the cheapest set whose delay is on whole samples.
    Lengths best;
    std::size_t bestCost = std::numeric_limits<std::size_t>::max();
    for (std::size_t a = a0; a < a0 + sharpSpread; ++a)
        for (std::size_t b = b0; b < b0 + wideSpread; ++b)
            for (std::size_t c = c0; c < c0 + wideSpread; ++c)
                for (std::size_t d = d0; d < d0 + sharpSpread; ++d) {
                    if (!aMeets[a - a0] || !bMeets[b - b0] || !cMeets[c - c0] || !dMeets[d - d0]) continue;
                    const Lengths n{a, b, c, d};
                    if (DelayHalfSamples(factor, stageHalfSamples, n) % (2 * factor) != 0) continue;
                    const std::size_t cost = kSharpFactor * CeilDiv(a, kSharpFactor) + factor * CeilDiv(b, wide) +
                                             factor * CeilDiv(c, wide) + kSharpFactor * CeilDiv(d, kSharpFactor);
                    if (cost < bestCost) {
                        bestCost = cost;
                        best = n;
                    }
                }
    if (best.sharpUp == 0) throw std::logic_error("Oversampler: no filter lengths meet the stop band");
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
