#include "Retimer/RetimerEngine.h"

#include <algorithm>
#include <cmath>
#include <new>

#include "System/Check.h"
#include "System/Trace.h"

namespace ora::retimer {

Engine::Engine(const fft::stretch::pv::EngineParam& stretchParam, const interp::Param& interpParam,
               const rate_control::Param& rateParam)
    : m_interpParam(interpParam), m_rateParam(rateParam), m_stretch(stretchParam) {
    system::Trace("ora::retimer::Engine::Engine(%p);", static_cast<void*>(this));
}

bool Engine::Configure(std::size_t channels, double minRatio, double maxRatio, fft::Backend backend) {
    m_configured = false;
    // The real-time re-timer keeps the duration: one input sample per output sample.
    if (!ORA_CHECK(m_interpParam.m_InputRate == 1.0f) || !ORA_CHECK(minRatio > 0.0 && minRatio <= maxRatio))
        return false;
    m_Upsampler.SetInvRate(m_interpParam.GetUpsamplerInvRate());
    const std::size_t frame = m_stretch.FrameLength();
    const std::int64_t latency = rate_control::LeastLatency(frame, minRatio, kLookahead);
    m_rate.Configure(m_rateParam, latency, minRatio, maxRatio);
    // Input history: the oldest analysis frame starts half a frame before
    // the oldest dry sample (latency back), plus a chunk being written.
    const auto history = static_cast<std::size_t>(m_rate.Latency()) + frame + 2 * kChunk;
    if (!m_stretch.Configure(channels, history, backend)) return false;
    const std::size_t fifo = static_cast<std::size_t>(std::max<std::int32_t>(m_rateParam.m_FifoCapacity, 0));
    if (!ORA_CHECK(fifo >= m_stretch.Hop() + 2 * kLookahead + 2)) return false;
    try {
        m_FifoOutI.clear();
        m_FifoOutI.resize(channels);
        for (auto& b : m_FifoOutI) b.Allocate(fifo, fft::Buffer::Layout::Ring);
    } catch (const std::bad_alloc&) {
        return false;
    }
    m_channels = channels;
    m_configured = true;
    ParametersChanged();
    Reset();
    return true;
}

bool Engine::Reset() noexcept {
    m_stretch.Reset();
    for (auto& b : m_FifoOutI) b.Clear();
    for (const auto& b : m_FifoOutI) {
        if (b.Written() != 0) {
            system::Trace("ora::retimer::Engine::Reset(%p): failure to reset FifoOutI.", static_cast<void*>(this));
            return false;
        }
    }
    m_rate.Reset(m_interpParam.m_OutputRatio);
    m_stretch.SetReadRate(m_rate.Target());
    m_output = 0;
    m_read = static_cast<double>(m_rate.Origin());
    m_emitted = 0;
    m_nextFrame = 0;
    m_lastStart = 0;
    return true;
}

void Engine::ParametersChanged() noexcept {
    m_rate.SetTarget(m_interpParam.m_OutputRatio);
    m_stretch.SetReadRate(std::max(m_rate.Target(), m_rate.Rate()));
}

void Engine::RunFrame() noexcept {
    const double half = static_cast<double>(m_stretch.FrameLength()) / 2.0;
    const double centre = static_cast<double>(m_nextFrame) * static_cast<double>(m_stretch.Hop()) + half;
    const double inputCentre =
        static_cast<double>(m_output - m_rate.Latency()) + (centre - m_read) / m_rate.Rate();
    std::int64_t start = std::llround(inputCentre - half);
    // Never ahead of the input, never behind the previous frame.
    start = std::min(start, m_stretch.Written() - static_cast<std::int64_t>(m_stretch.FrameLength()));
    if (m_nextFrame > 0) start = std::max(start, m_lastStart + 1);
    m_stretch.RunFrame(start);
    for (std::size_t c = 0; c < m_channels; ++c) m_FifoOutI[c].Write(m_stretch.Emitted(c), m_stretch.Hop());
    m_emitted += static_cast<std::int64_t>(m_stretch.Hop());
    m_lastStart = start;
    ++m_nextFrame;
}

bool Engine::Process(const Block& in, Block& out) noexcept {
    if (!m_configured) return false;
    if (!ORA_CHECK(static_cast<double>(out.GetLength()) >= static_cast<double>(in.GetLength()) * InvRate()) ||
        !ORA_CHECK(m_Upsampler.InvRate() == m_interpParam.GetUpsamplerInvRate()) ||
        !ORA_CHECK(in.channelCount == m_channels && out.channelCount == m_channels))
        return false;
    for (std::size_t c = 0; c < m_channels; ++c)
        if (!ORA_CHECK(in.channels[c] != out.channels[c])) return false;

    const float* inChunk[fft::Engine::kMaxChannels];
    float* outChunk[fft::Engine::kMaxChannels];
    for (std::size_t done = 0; done < in.GetLength();) {
        const std::size_t count = std::min(kChunk, in.GetLength() - done);
        for (std::size_t c = 0; c < m_channels; ++c) {
            inChunk[c] = in.channels[c] + done;
            outChunk[c] = out.channels[c] + done;
        }
        m_stretch.Write(inChunk, count);
        const std::int64_t first = m_output;
        for (std::size_t i = 0; i < count; ++i) {
            const double rate = m_rate.Next();
            const double base = std::floor(m_read);
            const auto index = static_cast<std::int64_t>(base);
            while (index + static_cast<std::int64_t>(kLookahead) >= m_emitted) RunFrame();
            const auto frac = static_cast<float>(m_read - base);
            for (std::size_t c = 0; c < m_channels; ++c) {
                const fft::Buffer& s = m_FifoOutI[c];
                outChunk[c][i] = interp::cubic::Interpolate(s.At(index - 1), s.At(index), s.At(index + 1),
                                                            s.At(index + 2), frac);
            }
            m_read += rate;
            ++m_output;
        }
        m_stretch.MixOutput(outChunk, first - m_rate.Latency(), count);
        done += count;
    }
    return true;
}

}  // namespace ora::retimer
