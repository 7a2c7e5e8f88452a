#include "zn_reverb_u15.h"

#include <algorithm>
#include <cmath>

#include "Common/ZenAssert.h"
#include "zn_reverb_u15_x2.h"
#include "zn_reverb_u15_x4.h"

namespace zen::reverb {

zn_reverb_u15::zn_reverb_u15() = default;
zn_reverb_u15::~zn_reverb_u15() = default;

std::unique_ptr<zn_reverb_u15> zn_reverb_u15::ForRate(float hostRate) {
    const auto rate = static_cast<int>(hostRate);
    if (rate == 176400 || rate == 192000) return std::make_unique<zn_reverb_u15_x4>();
    if (rate == 88200 || rate == 96000) return std::make_unique<zn_reverb_u15_x2>();
    return std::make_unique<zn_reverb_u15>();
}

float zn_reverb_u15::EngineRateFor(float hostRate) {
    const auto rate = static_cast<int>(hostRate);
    if (rate == 176400 || rate == 192000) return hostRate * 0.25f;
    if (rate == 88200 || rate == 96000) return hostRate * 0.5f;
    return hostRate;
}

void zn_reverb_u15::Dimension(std::uint32_t inputs, std::uint32_t outputs, float hostRate, std::uint32_t maxBlock,
                              std::uint32_t maxLaneLength) {
    m_inputs = std::clamp(inputs, 1u, kMaxChannels);
    m_outputs = std::clamp(outputs, 1u, kMaxChannels);
    m_engineRate = hostRate / static_cast<float>(Factor());
    // Resampled objects take whole groups of Factor() frames.
    m_hostFrames = (std::max(maxBlock, 1u) + Factor() - 1) / Factor() * Factor();
    m_engineFrames = Factor() == 1 ? m_hostFrames : kEngineFrame;
    SetChannelCount(std::max(m_inputs, m_outputs));
    ZenAudioAlgorithm::Prepare(hostRate, m_hostFrames);

    m_direct.Dimension(m_inputs, m_outputs);
    m_reflections.Dimension(m_inputs, m_engineRate, m_engineFrames);
    m_early.Dimension(kTaps, m_outputs);
    m_tail.Dimension(m_outputs, maxLaneLength, m_engineFrames, m_engineRate);
    m_pendingTail = zn_reverberant_u15_param(m_outputs);
    m_pendingLengths = false;
    m_control.SetSampleRate(m_engineRate);
    for (zn_eq* eq : {&m_earlyEq, &m_lateEq}) {
        eq->SetChannelCount(m_outputs);
        eq->Prepare(m_engineRate, m_engineFrames);
    }

    const std::size_t host = m_hostFrames, engine = m_engineFrames;
    m_in.Resize(m_inputs * host);
    m_directOut.Resize(m_outputs * host);
    m_taps.Resize(kTaps * engine);
    m_silence.Resize(engine);
    m_u.Resize(kLanes * engine);
    for (std::uint32_t k = 0; k < kLanes; ++k)
        m_tapRows[k] = k < zn_reverberant_u15::kLines ? m_taps.data() + k * engine : m_silence.data();
    m_wet.Resize(2 * m_outputs * engine);
    m_fade.Resize(engine);
    m_earlyPointers.resize(m_outputs);
    m_latePointers.resize(m_outputs);
    for (std::uint32_t ch = 0; ch < m_outputs; ++ch) {
        m_earlyPointers[ch] = m_wet.data() + ch * engine;
        m_latePointers[ch] = m_wet.data() + (m_outputs + ch) * engine;
    }

    m_down.clear();
    m_up.clear();
    if (Factor() > 1) {
        m_wetHost.Resize(m_outputs * host);
        m_engineIn.Resize(m_inputs * engine);
        for (std::uint32_t ch = 0; ch < m_inputs; ++ch)
            m_down.push_back(std::make_unique<ora::numeric::Downsampler>(
                ora::numeric::DownsamplerConfig{Factor(), kConverterTapsPerPhase, {}, 1, InFrameSize()}));
        for (std::uint32_t ch = 0; ch < m_outputs; ++ch)
            m_up.push_back(std::make_unique<ora::numeric::Upsampler>(
                ora::numeric::UpsamplerConfig{Factor(), kConverterTapsPerPhase, {}, 1, kEngineFrame}));
        m_stageStride = host + Factor();
        m_queueStride = host + 2 * Factor();
        m_stage.Resize(m_inputs * m_stageStride);
        m_queue.Resize(m_outputs * m_queueStride);
    }
    Reset();
}

void zn_reverb_u15::Configure(const zn_reverb_u15_param& param) {
    m_direct.Configure(param.direct);
    m_early.Configure(param.early);
    m_reflections.Configure(param.reflections);
    m_earlyEq.Configure(param.earlyEq);
    m_lateEq.Configure(param.lateEq);

    if (m_running && (m_pendingLengths || m_tail.LengthsDiffer(param.tail.core))) {
        // The new lengths wait for the late path to fall silent.
        for (std::uint32_t i = 0; i < kLanes; ++i) m_pendingTail.core.lengths(i) = param.tail.core.lengths(i);
        m_pendingLengths = true;
        m_tail.Configure(param.tail, false);
        m_control.Request(zn_reverb_u15_control::timed_action::fadeout_end_reset_and_fadein);
    } else {
        m_tail.Configure(param.tail, true);
    }
    for (std::uint32_t i = 0; i < kLanes; ++i) {
        m_pendingTail.core.gains(i) = param.tail.core.gains(i);
        m_pendingTail.core.coefficients(i) = param.tail.core.coefficients(i);
    }
    m_pendingTail.out.gains = param.tail.out.gains;
    m_pendingTail.out.tone = param.tail.out.tone;
}

void zn_reverb_u15::ApplyPendingLengths() noexcept {
    if (m_pendingLengths) m_tail.Configure(m_pendingTail, true);
    m_pendingLengths = false;
    m_tail.Reset();
    std::uint32_t longest = 0;
    for (std::uint32_t i = 0; i < zn_reverberant_u15::kLines; ++i) longest = std::max(longest, m_tail.Lines().Length(i));
    m_control.ActionDone(longest);
}

void zn_reverb_u15::Reset() {
    if (m_pendingLengths) m_tail.Configure(m_pendingTail, true);
    m_pendingLengths = false;
    m_control.Clear();
    m_direct.Reset();
    m_early.Reset();
    m_reflections.Reset();
    m_tail.Reset();
    m_earlyEq.Reset();
    m_lateEq.Reset();
    for (auto& d : m_down) d->Reset();
    for (auto& u : m_up) u->Reset();
    m_stage.Clear();
    m_queue.Clear();
    m_held = 0;
    m_queued = Factor() - 1;  // the wet delay of any-length blocks, as silence
    m_running = false;
}

void zn_reverb_u15::CopyIn(float* const* channels, std::size_t count) noexcept {
    for (std::uint32_t ch = 0; ch < m_inputs; ++ch) {
        float* in = m_in.data() + ch * m_hostFrames;
        for (std::size_t f = 0; f < count; ++f) {
            const float x = channels[ch][f];
            in[f] = std::fabs(x) <= kLargestInput ? x : (std::isfinite(x) ? std::copysign(kLargestInput, x) : 0.0f);
        }
    }
    m_direct.Process(m_in.data(), 1, m_hostFrames, m_directOut.data(), 1, m_hostFrames, count);
}

void zn_reverb_u15::ProcessWet(const float* in, std::size_t inStride, std::size_t count) noexcept {
    m_running = true;
    const std::size_t stride = m_engineFrames;
    m_reflections.Process(in, inStride, m_taps.data(), stride, count);
    m_early.Process(m_taps.data(), 1, stride, m_wet.data(), 1, stride, count);
    m_earlyEq.Process(m_earlyPointers.data(), count);

    m_transpose.ToFrames(m_tapRows, m_u.data(), count);
    m_vec.Scale(m_u.data(), kLateInputGain, m_u.data(), kLanes * count);
    if (m_control.ActionDue()) ApplyPendingLengths();
    m_tail.Process(m_u.data(), m_latePointers.data(), count);
    // Last resort: state that has gone non-finite anyway starts afresh.
    float check = 0.0f;
    for (std::size_t f = 0; f < count; ++f) check += m_latePointers[0][f];
    if (!std::isfinite(check)) {
        m_tail.Reset();
        for (float* late : m_latePointers) std::fill(late, late + count, 0.0f);
    }
    m_lateEq.Process(m_latePointers.data(), count);

    const bool fading = m_control.Gains(m_fade.data(), count);
    for (std::uint32_t ch = 0; ch < m_outputs; ++ch) {
        float* early = m_earlyPointers[ch];
        const float* late = m_latePointers[ch];
        if (fading) {
            for (std::size_t f = 0; f < count; ++f) early[f] += m_fade[f] * late[f];
        } else {
            m_vec.Add(early, late, early, count);
        }
    }
}

bool zn_reverb_u15::Process(float* const* channels, std::uint64_t count) {
    if (m_inputs == 0) return true;
    for (std::uint64_t done = 0; done < count;) {
        const auto n = static_cast<std::size_t>(std::min<std::uint64_t>(count - done, m_hostFrames));
        float* chunk[kMaxChannels];
        for (std::uint32_t ch = 0; ch < std::max(m_inputs, m_outputs); ++ch) chunk[ch] = channels[ch] + done;
        CopyIn(chunk, n);
        ProcessWet(m_in.data(), m_hostFrames, n);
        for (std::uint32_t ch = 0; ch < m_outputs; ++ch)
            m_vec.Add(m_directOut.data() + ch * m_hostFrames, m_earlyPointers[ch], chunk[ch], n);
        done += n;
    }
    return true;
}

void zn_reverb_u15::ResampledWet(const float* in, std::size_t inStride, float* out, std::size_t outStride,
                                 std::size_t count) noexcept {
    const std::uint32_t factor = Factor();
    for (std::size_t offset = 0; offset < count; offset += InFrameSize()) {
        const std::size_t in_frame_size = std::min<std::size_t>(count - offset, InFrameSize());
        ZEN_ASSERT(in_frame_size <= InFrameSize(), "in_frame_size <= InFrameSize()");
        const std::size_t engine = in_frame_size / factor;
        for (std::uint32_t ch = 0; ch < m_inputs; ++ch)
            m_down[ch]->Process(in + ch * inStride + offset, m_engineIn.data() + ch * m_engineFrames, in_frame_size);
        ProcessWet(m_engineIn.data(), m_engineFrames, engine);
        for (std::uint32_t ch = 0; ch < m_outputs; ++ch)
            m_up[ch]->Process(m_earlyPointers[ch], out + ch * outStride + offset, engine);
    }
}

bool zn_reverb_u15::ProcessResampled(float* const* channels, std::size_t count) noexcept {
    for (std::size_t done = 0; done < count;) {
        const std::size_t n = std::min<std::size_t>(count - done, m_hostFrames);
        float* chunk[kMaxChannels];
        for (std::uint32_t ch = 0; ch < std::max(m_inputs, m_outputs); ++ch) chunk[ch] = channels[ch] + done;
        CopyIn(chunk, n);
        ResampledWet(m_in.data(), m_hostFrames, m_wetHost.data(), m_hostFrames, n);
        for (std::uint32_t ch = 0; ch < m_outputs; ++ch) {
            m_vec.Add(m_directOut.data() + ch * m_hostFrames, m_wetHost.data() + ch * m_hostFrames, chunk[ch], n);
        }
        done += n;
    }
    return true;
}

bool zn_reverb_u15::ProcessAnyLength(float* const* channels, std::uint64_t count) noexcept {
    if (Factor() == 1) return Process(channels, count);
    const std::uint32_t factor = Factor();
    for (std::uint64_t done = 0; done < count;) {
        const auto n = static_cast<std::size_t>(std::min<std::uint64_t>(count - done, m_hostFrames));
        float* chunk[kMaxChannels];
        for (std::uint32_t ch = 0; ch < std::max(m_inputs, m_outputs); ++ch) chunk[ch] = channels[ch] + done;
        CopyIn(chunk, n);
        // Held-back frames and the block, in whole groups of `factor`.
        const std::size_t total = m_held + n;
        const std::size_t groups = total / factor * factor;
        for (std::uint32_t ch = 0; ch < m_inputs; ++ch)
            std::copy_n(m_in.data() + ch * m_hostFrames, n, m_stage.data() + ch * m_stageStride + m_held);
        ResampledWet(m_stage.data(), m_stageStride, m_queue.data() + m_queued, m_queueStride, groups);
        m_queued += groups;
        for (std::uint32_t ch = 0; ch < m_inputs; ++ch) {
            float* stage = m_stage.data() + ch * m_stageStride;
            std::copy(stage + groups, stage + total, stage);
        }
        m_held = total - groups;
        // The queue and the held frames always add up to factor - 1, so n are there.
        for (std::uint32_t ch = 0; ch < m_outputs; ++ch) {
            const float* direct = m_directOut.data() + ch * m_hostFrames;
            float* queue = m_queue.data() + ch * m_queueStride;
            for (std::size_t f = 0; f < n; ++f) chunk[ch][f] = direct[f] + queue[f];
            std::copy(queue + n, queue + m_queued, queue);
        }
        m_queued -= n;
        done += n;
    }
    return true;
}

}  // namespace zen::reverb
