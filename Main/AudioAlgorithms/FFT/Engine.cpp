#include "FFT/Engine.h"

#include <algorithm>
#include <cmath>
#include <new>
#include <stdexcept>

#include "System/Check.h"

namespace ora::fft {

Engine::Engine() : m_frame(std::make_unique<Frame>(m_pool)) {}

Engine::~Engine() {
    m_frame->Clear();
}

bool Engine::Configure(const EngineConfig& config) {
    m_configured = false;
    m_frame->Clear();
    m_pipeline = config.pipeline;
    const std::size_t channelCount = config.channels;
    if (!ORA_CHECK(channelCount > 0u && channelCount <= kMaxChannels) || !ORA_CHECK(config.frameLength > 0u) ||
        !ORA_CHECK(config.fftLength >= config.frameLength) || !ORA_CHECK(config.fftLength % 2u == 0u) ||
        !ORA_CHECK(config.hop > 0u && config.hop <= config.frameLength))
        return false;
    if (!ORA_CHECK(!m_pipeline.empty())) return false;
    for (Plugin* p : m_pipeline)
        if (!ORA_CHECK(p != nullptr)) return false;
    const Plugin::Config& last = m_pipeline.back()->config;
    if (!ORA_CHECK(last.m_traits == plugin::OUTPUT)) return false;

    try {
        if (!m_fft || m_fft->Length() != config.fftLength || m_fft->GetBackend() != config.backend)
            m_fft = std::make_unique<FFT>(config.fftLength, config.backend);
        if (!m_window.Build(config.frameLength, config.hop)) return false;
        const std::size_t history = config.inputCapacity > 0 ? config.inputCapacity : 4 * config.frameLength;
        m_in.clear();
        m_in.resize(channelCount);
        m_out.clear();
        m_out.resize(channelCount);
        m_pushOut.clear();
        m_pushOut.resize(channelCount);
        for (std::size_t c = 0; c < channelCount; ++c) {
            m_in[c].Allocate(history, Buffer::Layout::Ring);
            m_out[c].Allocate(config.frameLength, Buffer::Layout::Linear);
            m_pushOut[c].Allocate(2 * config.frameLength, Buffer::Layout::Ring);
        }
    } catch (const std::exception&) {
        return false;
    }
    if (!ORA_CHECK(m_in.size() == channelCount) || !ORA_CHECK(m_out.size() == channelCount)) return false;
    for (std::size_t c = 0; c < channelCount; ++c) {
        const float* in_c = m_in[c].data();
        const float* out_c = m_out[c].data();
        if (!ORA_CHECK(m_out[c].is_linearized()) || !ORA_CHECK(out_c != in_c)) return false;
    }

    m_context = Context{};
    m_context.channels = channelCount;
    m_context.rows = config.sharedRow && channelCount > 1 ? channelCount + 1 : channelCount;
    m_context.frameLength = config.frameLength;
    m_context.fftLength = config.fftLength;
    m_context.bins = config.fftLength / 2 + 1;
    m_context.synthesisHop = config.hop;
    m_context.analysisHop = static_cast<double>(config.hop);
    m_context.gain = config.gain;
    m_context.fft = m_fft.get();
    m_context.window = &m_window;
    m_context.in = &m_in;
    m_context.out = &m_out;
    m_inputLimit = config.inputLimit;
    for (Plugin* p : m_pipeline)
        if (!p->Configure(*m_frame, m_context)) return false;
    m_configured = true;
    Reset();
    return true;
}

void Engine::Reset() noexcept {
    for (auto& b : m_in) b.Clear();
    for (auto& b : m_out) b.Clear();
    for (auto& b : m_pushOut) b.Clear();
    for (Plugin* p : m_pipeline) p->Reset();
    m_context.frameIndex = 0;
    m_context.analysisHop = static_cast<double>(m_context.synthesisHop);
    m_context.analysisOffset = 0.0;
    m_lastCentre = 0.0;
    m_pushNextStart = static_cast<std::int64_t>(m_context.synthesisHop) - static_cast<std::int64_t>(m_context.frameLength);
}

void Engine::Write(const float* const* in, std::size_t frames) noexcept {
    for (std::size_t c = 0; c < m_in.size(); ++c) {
        if (m_inputLimit > 0.0f)
            m_in[c].WriteLimited(in[c], frames, m_inputLimit);
        else
            m_in[c].Write(in[c], frames);
    }
}

std::int64_t Engine::Written() const { return m_in.empty() ? 0 : m_in[0].Written(); }

void Engine::RunFrameAt(double centre, double analysisHop, const TimeMap* map) noexcept {
    if (!m_configured) return;
    if (m_context.frameIndex > 0) for (auto& b : m_out) b.Shift(m_context.synthesisHop);
    const double half = static_cast<double>(m_context.frameLength / 2);
    const double start = std::floor(centre - half + 0.5);
    m_context.analysisStart = static_cast<std::int64_t>(start);
    m_context.analysisOffset = centre - (start + half);
    m_context.analysisHop = std::max(analysisHop, 1.0);
    m_context.timeMap = map;
    for (Plugin* p : m_pipeline) p->Process(*m_frame, m_context);
    m_context.timeMap = nullptr;
    m_lastCentre = centre;
    ++m_context.frameIndex;
}

void Engine::RunFrame(std::int64_t analysisStart) noexcept {
    const double centre = static_cast<double>(analysisStart) + static_cast<double>(m_context.frameLength / 2);
    RunFrameAt(centre, m_context.frameIndex > 0 ? centre - m_lastCentre : static_cast<double>(m_context.synthesisHop));
}

std::size_t Engine::Push(const float* const* in, float* const* out, std::size_t frames) noexcept {
    if (!m_configured) return 0;
    for (std::size_t c = 0; c < m_in.size(); ++c) {
        const float* in_c = in[c];
        const float* out_c = out[c];
        if (!ORA_CHECK(out_c != in_c)) return 0;
    }
    const auto length = static_cast<std::int64_t>(m_context.frameLength);
    const auto hop = static_cast<std::int64_t>(m_context.synthesisHop);
    const float* inChunk[64];
    float* outChunk[64];
    const std::size_t channelCount = std::min<std::size_t>(m_in.size(), 64);
    // Chunks of one hop keep the emitted output inside its ring until read.
    for (std::size_t done = 0; done < frames;) {
        const std::size_t count = std::min(frames - done, m_context.synthesisHop);
        for (std::size_t c = 0; c < channelCount; ++c) {
            inChunk[c] = in[c] + done;
            outChunk[c] = out[c] + done;
        }
        const std::int64_t first = Written();
        Write(inChunk, count);
        while (m_pushNextStart + length <= Written()) {
            RunFrame(m_pushNextStart);
            for (std::size_t c = 0; c < m_out.size(); ++c) m_pushOut[c].Write(m_out[c].data(), m_context.synthesisHop);
            m_pushNextStart += hop;
        }
        // Emission starts at time hop - length; output n shows time n - (length - 1).
        for (std::size_t c = 0; c < channelCount; ++c) m_pushOut[c].Read(first + 1 - hop, outChunk[c], count);
        done += count;
    }
    return frames;
}

}  // namespace ora::fft
