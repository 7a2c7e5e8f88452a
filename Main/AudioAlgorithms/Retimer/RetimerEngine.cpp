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
    // Centres from half a frame behind the reader to the newest input, at
    // the shortest analysis hop; and the frames one frame's map spans.
    const double shortestHop = static_cast<double>(m_stretch.Hop()) / maxRatio;
    const double kept = static_cast<double>(m_rate.Latency()) + 2.0 * static_cast<double>(frame);
    std::size_t centres = 1;
    while (static_cast<double>(centres) < std::ceil(kept / shortestHop) + 8.0) centres *= 2;
    if (!ORA_CHECK(static_cast<double>(frame) / shortestHop + 4.0 <= static_cast<double>(fft::TimeMap::kCapacity)))
        return false;
    try {
        m_FifoOutI.clear();
        m_FifoOutI.resize(channels);
        for (auto& b : m_FifoOutI) b.Allocate(fifo, fft::Buffer::Layout::Ring);
        m_centres.assign(centres, 0.0);
        m_centreMask = centres - 1;
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
    m_output = 0;
    m_emitted = 0;
    m_decided = 0;
    m_nextFrame = 0;
    m_segment = 0;
    m_segmentSlope = 0.0;  // found on the first read
    return true;
}

void Engine::ParametersChanged() noexcept { m_rate.SetTarget(m_interpParam.m_OutputRatio); }

double Engine::SynthesisCentre(std::int64_t frame) const {
    return static_cast<double>(frame * static_cast<std::int64_t>(m_stretch.Hop())) +
           static_cast<double>(m_stretch.FrameLength() / 2);
}

void Engine::DecideCentre(double ratio) noexcept {
    const double centre = m_decided == 0 ? static_cast<double>(m_rate.Origin() - m_rate.Latency())
                                         : Centre(m_decided - 1) + static_cast<double>(m_stretch.Hop()) / ratio;
    m_centres[static_cast<std::size_t>(m_decided) & m_centreMask] = centre;
    ++m_decided;
}

void Engine::RunFrame() noexcept {
    const std::int64_t frame = m_nextFrame;
    const double centre = Centre(frame);
    const double hop = SynthesisCentre(1) - SynthesisCentre(0);
    const double half = static_cast<double>(m_stretch.FrameLength() / 2);
    // The centres around this one, over the frame and one beyond each end.
    std::int64_t first = frame;
    while (first > 0 && first > frame - static_cast<std::int64_t>(fft::TimeMap::kCapacity / 2) &&
           Centre(first) > centre - half)
        --first;
    m_map.Clear();
    for (std::int64_t i = first; i < m_decided; ++i) {
        if (!m_map.Add(Centre(i) - centre, static_cast<double>(i - frame) * hop)) break;
        if (Centre(i) >= centre + half) break;
    }
    const double analysisHop = frame > 0 ? centre - Centre(frame - 1) : Centre(frame + 1) - centre;
    // Content that would fold over when read faster than written is left out.
    m_stretch.SetReadRate(m_map.MaxSlope());
    m_stretch.RunFrame(centre, analysisHop, &m_map);
    for (std::size_t c = 0; c < m_channels; ++c) m_FifoOutI[c].Write(m_stretch.Emitted(c), m_stretch.Hop());
    m_emitted += static_cast<std::int64_t>(m_stretch.Hop());
    ++m_nextFrame;
}

double Engine::ReadPosition(double time) noexcept {
    if (m_segmentSlope == 0.0 || time >= Centre(m_segment + 1)) {
        while (time >= Centre(m_segment + 1)) ++m_segment;
        m_segmentSlope = (SynthesisCentre(1) - SynthesisCentre(0)) / (Centre(m_segment + 1) - Centre(m_segment));
    }
    return SynthesisCentre(m_segment) + (time - Centre(m_segment)) * m_segmentSlope;
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
    const std::int64_t latency = m_rate.Latency();
    for (std::size_t done = 0; done < in.GetLength();) {
        const std::size_t count = std::min(kChunk, in.GetLength() - done);
        for (std::size_t c = 0; c < m_channels; ++c) {
            inChunk[c] = in.channels[c] + done;
            outChunk[c] = out.channels[c] + done;
        }
        m_stretch.Write(inChunk, count);
        const std::int64_t first = m_output;
        for (std::size_t i = 0; i < count; ++i) {
            // This sample's input time is m_output: centres up to it take
            // the ratio of now.
            const double ratio = m_rate.Next();
            while (m_decided < 2 || Centre(m_decided - 1) <= static_cast<double>(m_output)) DecideCentre(ratio);
            const double position = ReadPosition(static_cast<double>(m_output - latency));
            const double base = std::floor(position);
            const auto index = static_cast<std::int64_t>(base);
            while (index + static_cast<std::int64_t>(kLookahead) >= m_emitted) RunFrame();
            const auto frac = static_cast<float>(position - base);
            for (std::size_t c = 0; c < m_channels; ++c) {
                const fft::Buffer& s = m_FifoOutI[c];
                outChunk[c][i] = interp::cubic::Interpolate(s.Held(index - 1), s.Held(index), s.Held(index + 1),
                                                            s.Held(index + 2), frac);
            }
            ++m_output;
        }
        m_stretch.MixOutput(outChunk, first - latency, count);
        done += count;
    }
    return true;
}

}  // namespace ora::retimer
