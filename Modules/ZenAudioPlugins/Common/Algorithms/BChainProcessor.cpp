#include "BChainProcessor.h"

#include <cmath>

namespace {

// BiQuad's "Shape" for each EQ band shape of the document (off: -1).
constexpr float kShapes[] = {
    -1.0f, BiQuad::kBell, BiQuad::kLowShelf, BiQuad::kHighShelf, BiQuad::kLowPass, BiQuad::kHighPass};

}  // namespace

BChainProcessor::BChainProcessor() { SetChannelCount(2); }

BChainProcessor::~BChainProcessor() = default;

bool BChainProcessor::Prepare(float sampleRate, std::uint32_t maxBlock) {
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    for (std::size_t c = 0; c < m_strips.size(); ++c) Apply(c);
    return true;
}

void BChainProcessor::SetChannelCount(std::uint64_t channels) {
    ZenAudioAlgorithm::SetChannelCount(channels);
    const std::size_t before = m_strips.size();
    m_strips.resize(channels);
    for (std::size_t c = before; c < m_strips.size(); ++c) {
        for (auto& band : m_strips[c].bands) band = std::make_unique<BiQuad>();
        m_strips[c].delay = std::make_unique<zen::Delay>();
        Apply(c);
    }
}

void BChainProcessor::Configure(const std::vector<Channel>& settings) {
    m_settings = settings;
    for (std::size_t c = 0; c < m_strips.size(); ++c) Apply(c);
}

void BChainProcessor::Apply(std::size_t channel) {
    Strip& strip = m_strips[channel];
    strip.active = channel < m_settings.size();
    const Channel neutral;
    const Channel& s = strip.active ? m_settings[channel] : neutral;
    const double magnitude = std::pow(10.0, s.gainDb / 20.0);
    strip.gain = static_cast<float>(s.inverted ? -magnitude : magnitude);
    for (std::size_t b = 0; b < kBands; ++b) {
        BiQuad& section = *strip.bands[b];
        section.Prepare(static_cast<float>(GetSampleRate()), GetMaxBlockSize());
        const auto& band = s.bands[b];
        const bool on = band.shape != zen::host::BChainDocument::kOff;
        if (on) {
            section.SetParameter(BiQuad::kShape, kShapes[band.shape]);
            section.SetParameter(BiQuad::kGain, static_cast<float>(band.gainDb));
            section.SetParameter(BiQuad::kFreq, static_cast<float>(band.frequency));
            section.SetParameter(BiQuad::kQ, static_cast<float>(band.q));
        }
        section.SetParameter(BiQuad::kIn, on ? 1.0f : 0.0f);
    }
    const auto samples = static_cast<std::uint32_t>(std::llround(s.delayMs * GetSampleRate() / 1000.0));
    if (samples != strip.delay->GetDelay()) strip.delay->Dimension(1, GetMaxBlockSize(), samples);
}

std::uint32_t BChainProcessor::GetDelaySamples(std::uint64_t channel) const {
    return channel < m_strips.size() ? m_strips[channel].delay->GetDelay() : 0;
}

bool BChainProcessor::ProcessChannel(std::uint64_t channel, float* samples, std::uint64_t count) {
    if (channel >= m_strips.size()) return false;
    Strip& strip = m_strips[channel];
    if (!strip.active) return true;
    strip.delay->ProcessChannel(0, samples, count);
    for (std::uint64_t i = 0; i < count; ++i) samples[i] *= strip.gain;
    for (auto& band : strip.bands)
        if (band->IsEnabled()) band->ProcessChannel(0, samples, count);
    return true;
}

bool BChainProcessor::Process(float* const* channels, std::uint64_t count) {
    for (std::uint64_t c = 0; c < m_strips.size(); ++c) ProcessChannel(c, channels[c], count);
    return true;
}

void BChainProcessor::Reset() {
    for (Strip& strip : m_strips) {
        strip.delay->Reset();
        for (auto& band : strip.bands) band->Reset();
    }
}
