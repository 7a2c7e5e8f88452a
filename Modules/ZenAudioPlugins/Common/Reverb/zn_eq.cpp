#include "zn_eq.h"

#include <algorithm>
#include <cmath>

namespace zen::reverb {

namespace {

constexpr float kOn = 1.0f;

float GainDb(float gain) { return 20.0f * std::log10(std::max(gain, zn_eq::kMinimumGain)); }

ora::numeric::BiquadSection Section(const BiQuad& band) {
    const BiQuad::Coefficients& c = band.GetCoefficients();
    return {c.c0, c.c1, c.c2, c.c3, c.g};
}

}  // namespace

zn_eq::zn_eq() {
    m_low.SetParameter(BiQuad::kShape, BiQuad::kLowShelf);
    m_high.SetParameter(BiQuad::kShape, BiQuad::kHighShelf);
    m_low.SetParameter(BiQuad::kIn, kOn);
    m_high.SetParameter(BiQuad::kIn, kOn);
    Design(m_low, m_current.low);
    Design(m_high, m_current.high);
}

bool zn_eq::Prepare(float sampleRate, std::uint32_t maxBlock) {
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    m_low.Prepare(sampleRate, maxBlock);
    m_high.Prepare(sampleRate, maxBlock);
    m_current = m_target;
    Design(m_low, m_current.low);
    Design(m_high, m_current.high);
    Reset();
    return true;
}

void zn_eq::SetChannelCount(std::uint64_t channels) {
    ZenAudioAlgorithm::SetChannelCount(channels);
    m_low.SetChannelCount(channels);
    m_high.SetChannelCount(channels);
}

void zn_eq::Design(BiQuad& band, const zn_eq_param::Band& values) {
    band.SetParameter(BiQuad::kGain, GainDb(values.gain));
    band.SetParameter(BiQuad::kFreq, values.frequency);
    band.SetParameter(BiQuad::kQ, values.shape);
    ++m_designs;
}

void zn_eq::Configure(const zn_eq_param& param) noexcept {
    m_target = param;
    if (!m_settled) return;
    m_settled = false;
    if (m_current.low != m_target.low) Design(m_low, m_current.low = m_target.low);
    if (m_current.high != m_target.high) Design(m_high, m_current.high = m_target.high);
}

bool zn_eq::Glide(zn_eq_param::Band& current, const zn_eq_param::Band& target, std::uint64_t count) const {
    if (current == target) return false;
    const double seconds = static_cast<double>(count) / std::max(1, GetSampleRate());
    const double maxDb = kGlideDbPerSecond * seconds, maxOctaves = kGlideOctavesPerSecond * seconds;
    const double db = GainDb(current.gain), targetDb = GainDb(target.gain);
    const double nextDb = db + std::clamp(targetDb - db, -maxDb, maxDb);
    const double octaves = std::log2(target.frequency / current.frequency);
    const double nextOctaves = std::clamp(octaves, -maxOctaves, maxOctaves);
    current.gain = nextDb == targetDb ? target.gain : static_cast<float>(std::pow(10.0, nextDb / 20.0));
    current.frequency = nextOctaves == octaves ? target.frequency
                                               : static_cast<float>(current.frequency * std::exp2(nextOctaves));
    current.shape = target.shape;
    return true;
}

bool zn_eq::Process(float* const* channels, std::uint64_t count) {
    const std::uint64_t channelCount = std::min<std::uint64_t>(GetChannelCount(), kMaxChannels);
    for (std::uint64_t done = 0; done < count;) {
        std::uint64_t n = count - done;
        if (m_current.low != m_target.low || m_current.high != m_target.high) {
            n = std::min(n, kGlideChunk);
            if (Glide(m_current.low, m_target.low, n)) Design(m_low, m_current.low);
            if (Glide(m_current.high, m_target.high, n)) Design(m_high, m_current.high);
        }
        float* part[kMaxChannels];
        for (std::uint64_t c = 0; c < channelCount; ++c) part[c] = channels[c] + done;
        const ora::numeric::BiquadSection sections[2] = {Section(m_low), Section(m_high)};
        m_pair.Process(sections, m_state, part, channelCount, n);
        // A non-finite input would otherwise ring in a band for ever.
        for (std::size_t b = 0; b < 2; ++b)
            for (std::uint64_t c = 0; c < channelCount; ++c)
                if (!std::isfinite(m_state.w1[b][c]) || !std::isfinite(m_state.w2[b][c]))
                    m_state.w1[b][c] = m_state.w2[b][c] = 0.0;
        done += n;
    }
    return true;
}

void zn_eq::Reset() {
    m_low.Reset();
    m_high.Reset();
    m_state = {};
    m_current = m_target;
    Design(m_low, m_current.low);
    Design(m_high, m_current.high);
    m_settled = true;
}

}  // namespace zen::reverb
