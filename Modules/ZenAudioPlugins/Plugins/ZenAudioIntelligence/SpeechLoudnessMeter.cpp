#include "SpeechLoudnessMeter.h"

#include <algorithm>
#include <cmath>

#include "zen/LevellerEngine.h"
#include "zen/fvad.h"

SpeechLoudnessMeter::SpeechLoudnessMeter() = default;

SpeechLoudnessMeter::~SpeechLoudnessMeter() { fvad_free(m_vad); }

bool SpeechLoudnessMeter::Prepare(double sampleRate) {
    if (m_vad == nullptr) m_vad = fvad_new();
    if (m_vad == nullptr) return false;
    m_frameLength = std::max<std::size_t>(kDetectorFrame, static_cast<std::size_t>(sampleRate / kFramesPerSecond));
    m_mono.assign(m_frameLength, 0.0f);
    m_weighting.Prepare(sampleRate, 2);
    Reset();
    return true;
}

void SpeechLoudnessMeter::Reset() noexcept {
    if (m_vad != nullptr) {
        fvad_reset(m_vad);
        fvad_set_sample_rate(m_vad, kDetectorRate);
        fvad_set_mode(m_vad, m_mode);
    }
    m_weighting.Reset();
    m_filled = 0;
    m_framePower = 0.0;
    m_frames = 0;
    m_voiced = 0;
    m_voicedPower = 0.0;
}

void SpeechLoudnessMeter::SetMode(int mode) noexcept {
    m_mode = std::clamp(mode, 0, 3);
    if (m_vad != nullptr) fvad_set_mode(m_vad, m_mode);
}

void SpeechLoudnessMeter::Process(const float* left, const float* right, std::size_t n) noexcept {
    if (m_vad == nullptr) return;
    while (n > 0) {
        const std::size_t count = std::min(n, m_frameLength - m_filled);
        if (right != nullptr) {
            double p0 = 0.0, p1 = 0.0;
            m_weighting.AccumulatePower(0, left, right, count, p0, p1);
            m_framePower += p0 + p1;
            for (std::size_t i = 0; i < count; ++i) m_mono[m_filled + i] = 0.5f * (left[i] + right[i]);
            right += count;
        } else {
            m_weighting.AccumulatePower(0, left, count, m_framePower);
            std::copy_n(left, count, m_mono.begin() + static_cast<std::ptrdiff_t>(m_filled));
        }
        left += count;
        m_filled += count;
        n -= count;
        if (m_filled == m_frameLength) CloseFrame();
    }
}

void SpeechLoudnessMeter::CloseFrame() noexcept {
    // Box averages down to the detector's rate: enough for its own filters,
    // which work at 8 kHz.
    std::int16_t frame[kDetectorFrame];
    for (std::size_t k = 0; k < kDetectorFrame; ++k) {
        const std::size_t begin = k * m_frameLength / kDetectorFrame;
        const std::size_t end = std::max(begin + 1, (k + 1) * m_frameLength / kDetectorFrame);
        float sum = 0.0f;
        for (std::size_t i = begin; i < end; ++i) sum += m_mono[i];
        const float value = std::clamp(sum / static_cast<float>(end - begin), -1.0f, 1.0f);
        frame[k] = static_cast<std::int16_t>(std::lrint(value * 32767.0f));
    }
    const double meanSquare = m_framePower / static_cast<double>(m_frameLength);
    ++m_frames;
    if (fvad_process(m_vad, frame, kDetectorFrame) == 1) {
        ++m_voiced;
        m_voicedPower += meanSquare;
    }
    m_filled = 0;
    m_framePower = 0.0;
}

SpeechLoudnessMeter::Entry SpeechLoudnessMeter::TakeEntry() noexcept {
    Entry entry{zen::levelling::kNoSpeech, 0};
    if (m_frames > 0) {
        entry.voicedPerMille = static_cast<std::int32_t>(1000u * m_voiced / m_frames);
        const bool enough = 100.0 * m_voiced >= static_cast<double>(m_fraction) * m_frames;
        if (enough && m_voiced > 0 && m_voicedPower > 0.0) {
            const double lufs = kLoudnessOffset + 10.0 * std::log10(m_voicedPower / m_voiced);
            if (lufs >= m_floor) entry.loudness = static_cast<float>(lufs);
        }
    }
    m_frames = 0;
    m_voiced = 0;
    m_voicedPower = 0.0;
    return entry;
}
