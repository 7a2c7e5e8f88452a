#include "Oversampler.h"

#include <cmath>
#include <stdexcept>

#include "Algorithms/KaiserLowPass.h"

namespace {

// Kaiser's estimates: the window's shape for a stop band of A dB, and the
// length for a transition band of df cycles per sample.
double KaiserBeta(double attenuationDb) { return 0.1102 * (attenuationDb - 8.7); }
double KaiserLength(double attenuationDb, double df) { return (attenuationDb - 7.95) / (14.36 * df); }

}  // namespace

Oversampler::Oversampler(std::size_t factor, std::size_t stageHalfSamples)
    : m_factor(factor),
      m_stageHalfSamples(stageHalfSamples),
      m_downTaps(TapsPerPhase(kStopbandEdge)),
      m_upTaps(TapsPerPhase(kImageStopbandEdge) + (TapsPerPhase(kImageStopbandEdge) + m_downTaps) % 2) {
    if (factor != 2 && factor != 4 && factor != 8) throw std::invalid_argument("Oversampler: factor 2, 4 or 8");
    if (stageHalfSamples > 2) throw std::invalid_argument("Oversampler: a stage delay of 0, 1 or 2 half samples");
}

Oversampler::~Oversampler() = default;

std::size_t Oversampler::TapsPerPhase(double stopEdge) {
    // The transition band scales with the factor, so the taps per phase do not.
    return static_cast<std::size_t>(std::ceil(KaiserLength(kStopbandDb, stopEdge - kPassbandEdge)));
}

std::uint32_t Oversampler::GetLatency() const {
    // (Nu - 1) / 2 + (Nd - 1) / 2 + stage - (factor - 1) high-rate samples,
    // the last for the decimator keeping the last sample of each group.
    return static_cast<std::uint32_t>((m_upTaps + m_downTaps - 2) / 2);
}

std::vector<float> Oversampler::Prototype(std::size_t factor, std::size_t taps, double stopEdge) {
    const double cutoff = 0.5 * (kPassbandEdge + stopEdge) / static_cast<double>(factor);
    return ora::numeric::KaiserLowPass(taps, cutoff, KaiserBeta(kStopbandDb));
}

bool Oversampler::Prepare(float sampleRate, std::uint32_t maxBlock) {
    const std::size_t block = maxBlock > 0 ? maxBlock : 1;
    // Delays (Nu - 1) / 2 + (Nd - 1) / 2 plus the stage's must leave the
    // decimator's phase on a whole base-rate sample: Nu + Nd + 2 x stage a
    // multiple of 2 x factor.
    const std::vector<float> up = Prototype(m_factor, m_factor * m_upTaps - m_stageHalfSamples, kImageStopbandEdge);
    const std::vector<float> down = Prototype(m_factor, m_factor * m_downTaps, kStopbandEdge);
    for (Channel& channel : m_channels) {
        channel.up = std::make_unique<ora::numeric::Upsampler>(
            ora::numeric::UpsamplerConfig{m_factor, m_upTaps, up, 1, block});
        channel.down = std::make_unique<ora::numeric::Downsampler>(
            ora::numeric::DownsamplerConfig{m_factor, m_downTaps, down, 1, block * m_factor});
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
        if (channel.up) channel.up->Reset();
        if (channel.down) channel.down->Reset();
        channel.high.Clear();
    }
}

float* Oversampler::Up(std::uint64_t channel, const float* in, std::uint64_t frames) noexcept {
    Channel& ch = m_channels[channel];
    ch.up->Process(in, ch.high.data(), frames);
    return ch.high.data();
}

void Oversampler::Down(std::uint64_t channel, float* out, std::uint64_t frames) noexcept {
    Channel& ch = m_channels[channel];
    ch.down->Process(ch.high.data(), out, frames * m_factor);
}

bool Oversampler::Process(float* const* channels, std::uint64_t count) {
    for (std::uint64_t c = 0; c < m_channels.size(); ++c) {
        if (!m_channels[c].up) return false;
        Up(c, channels[c], count);
        Down(c, channels[c], count);
    }
    return true;
}
