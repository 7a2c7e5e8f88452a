// Voice activity of a multichannel stream at any rate, from the fvad_*
// detector: the channels' mean is low-passed and resampled to 16 kHz, decided
// every 10 ms, and the decisions turned into a voice probability that rises
// at once with a voiced frame, holds through short pauses between words and
// then falls off smoothly.
//
// Construction and Configure allocate; Process and Reset are real-time safe.
#pragma once

#include <cstddef>
#include <cstdint>

#include "Common/Algorithms/BiQuad.h"
#include "System/AlignedBuffer.h"

struct Fvad;

namespace zen::noise_reduction {

class zn_voice_activity {
public:
    static constexpr int kDetectorRate = 16000;
    static constexpr std::size_t kDetectorFrame = 160;  // 10 ms
    static constexpr int kMode = 1;                      // aggressiveness
    static constexpr double kAntiAliasHz = 7000.0;
    static constexpr double kHoldSeconds = 0.2;           // pauses between words
    static constexpr double kFallSeconds = 0.15;          // from 1 to 0 after the hold
    // The detector hears full scale at most; huge samples must not overflow its filter.
    static constexpr float kLargestInput = 4.0f;

    zn_voice_activity();
    ~zn_voice_activity();
    zn_voice_activity(const zn_voice_activity&) = delete;
    zn_voice_activity& operator=(const zn_voice_activity&) = delete;

    bool Configure(double sampleRate, std::size_t maxBlock);
    void Reset() noexcept;

    // Samples [offset, offset + count) of the channels.
    void Process(const float* const* channels, std::size_t channelCount, std::size_t offset,
                 std::size_t count) noexcept;

    float Probability() const { return m_probability; }
    bool LastDecision() const { return m_lastDecision; }
    std::uint64_t Decisions() const { return m_decisions; }

private:
    void Decide() noexcept;

    Fvad* m_vad = nullptr;
    BiQuad m_antiAlias[2];
    double m_sampleRate = 48000.0;
    double m_step = 3.0;  // input samples per detector sample
    double m_phase = 0.0;
    float m_previous = 0.0f;
    std::size_t m_filled = 0;
    std::int16_t m_frame[kDetectorFrame] = {};
    ora::AlignedBuffer<float> m_mono;
    std::uint32_t m_holdFrames = 0;
    std::uint32_t m_holdLeft = 0;
    float m_fallPerFrame = 0.0f;
    float m_probability = 0.0f;
    bool m_lastDecision = false;
    std::uint64_t m_decisions = 0;
};

}  // namespace zen::noise_reduction
