#include "zn_stft.h"

#include <algorithm>
#include <cmath>
#include <new>

namespace zen::noise_reduction {

std::size_t zn_stft::FrameLengthFor(double sampleRate) {
    const double wanted = std::max(64.0, kFrameSeconds * sampleRate);
    std::size_t length = 64;
    while (static_cast<double>(length) * 1.5 < wanted) length *= 2;
    return length;
}

bool zn_stft::Configure(std::size_t channels, double sampleRate, ora::fft::Plugin* processor) {
    m_channels = 0;
    if (channels == 0 || channels > kMaxChannels || !(sampleRate > 0.0) || processor == nullptr) return false;
    m_frameLength = FrameLengthFor(sampleRate);
    m_hop = m_frameLength / kOverlap;
    try {
        m_input.clear();
        m_input.resize(channels);
        for (auto& b : m_input) b.Resize(m_hop);
    } catch (const std::bad_alloc&) {
        return false;
    }
    ora::fft::EngineConfig config;
    config.channels = channels;
    config.frameLength = m_frameLength;
    config.fftLength = m_frameLength;
    config.hop = m_hop;
    config.pipeline = {&m_in2dft, processor, &m_dft2out};
    if (!m_engine.Configure(config)) return false;
    m_channels = channels;
    Reset();
    return true;
}

void zn_stft::Reset() noexcept {
    if (m_engine.IsConfigured()) m_engine.Reset();
    m_written = 0;
}

std::size_t zn_stft::ToNextFrame() const {
    return m_hop > 0 ? m_hop - static_cast<std::size_t>(m_written % m_hop) : 0;
}

void zn_stft::Process(float* const* channels, std::size_t offset, std::size_t count) noexcept {
    if (m_channels == 0) return;
    const float* in[kMaxChannels];
    float* out[kMaxChannels];
    for (std::size_t done = 0; done < count;) {
        const std::size_t n = std::min(count - done, m_hop);
        for (std::size_t c = 0; c < m_channels; ++c) {
            const float* x = channels[c] + offset + done;
            float* copy = m_input[c].data();
            for (std::size_t i = 0; i < n; ++i)
                copy[i] = std::isfinite(x[i]) ? std::clamp(x[i], -kLargestInput, kLargestInput) : 0.0f;
            in[c] = copy;
            out[c] = channels[c] + offset + done;
        }
        m_engine.Push(in, out, n);
        m_written += n;
        done += n;
    }
}

}  // namespace zen::noise_reduction
